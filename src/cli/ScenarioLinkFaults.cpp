#include "cli/ScenarioLinkFaults.h"

#include <cctype>

namespace cli {
namespace {

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    const auto first = text.find_first_not_of(" \t");
    text.remove_prefix(first == std::string_view::npos ? text.size() : first);
    if (text.size() < prefix.size()) {
        return false;
    }
    for (std::size_t i = 0; i < prefix.size(); ++i) {
        if (std::toupper(static_cast<unsigned char>(text[i])) !=
            std::toupper(static_cast<unsigned char>(prefix[i]))) {
            return false;
        }
    }
    return true;
}

}  // namespace

ScenarioLinkFaults::ScenarioLinkFaults(sim::LinkFaultRules rules,
                                       std::function<void()> restartInstrument)
    : m_rules(std::move(rules)), m_restartInstrument(std::move(restartInstrument)) {
    for (const auto& rule : m_rules.stallOn) {
        m_prefixes.push_back({rule, Action::Stall});
    }
    for (const auto& rule : m_rules.dropMidResponseOn) {
        m_prefixes.push_back({rule, Action::CutResponse});
    }
    for (const auto& rule : m_rules.garbageOn) {
        m_prefixes.push_back({rule, Action::Garbage});
    }
}

bool ScenarioLinkFaults::due(const std::optional<sim::LinkCount>& count, long messages) {
    return count && messages % count->commands == 0 && messages / count->commands <= count->times;
}

lan::LinkFaults::Action ScenarioLinkFaults::before(std::string_view message) {
    ++m_messages;
    if (due(m_rules.restartAfterCommands, m_messages)) {
        return Action::Restart;
    }
    if (due(m_rules.dropAfterCommands, m_messages)) {
        return Action::Drop;
    }
    for (auto& prefix : m_prefixes) {
        if (prefix.used < prefix.rule.times && startsWithNoCase(message, prefix.rule.command)) {
            ++prefix.used;
            return prefix.action;
        }
    }
    return Action::None;
}

}  // namespace cli
