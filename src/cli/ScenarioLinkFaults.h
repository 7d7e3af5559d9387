#pragma once

// The scenario's link faults as the LAN servers consult them: program messages are counted
// over all clients, prefixes matched case-insensitively, each rule used its `times`.

#include <functional>
#include <string_view>
#include <vector>

#include "lan/LinkFaults.h"
#include "sim/Scenario.h"

namespace cli {

class ScenarioLinkFaults : public lan::LinkFaults {
  public:
    ScenarioLinkFaults(sim::LinkFaultRules rules, std::function<void()> restartInstrument);

    Action before(std::string_view message) override;
    std::chrono::milliseconds splitDelay() const override {
        return std::chrono::milliseconds(m_rules.splitReplyMs);
    }

  private:
    struct Prefix {
        sim::LinkRule rule;
        Action action;
        int used = 0;
    };

    void restartDevice() override { m_restartInstrument(); }
    // Whether the count-th message ends a period of `count`, within its times.
    static bool due(const std::optional<sim::LinkCount>& count, long messages);

    sim::LinkFaultRules m_rules;
    std::function<void()> m_restartInstrument;
    std::vector<Prefix> m_prefixes;
    long m_messages = 0;
};

}  // namespace cli
