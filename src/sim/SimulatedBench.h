#pragma once

// The operator's hands at the simulated analyzer's bench: an OperatorUi that forwards every
// box to the real front end and, from what was asked and answered, changes the cabling:
// after a "Connections" box the instructed cables are fitted (or the scenario's wrong pad);
// a "Check Connection" answered Yes fixes one attempt of a disconnected receiver; an
// "Unexpected power ratio reading" answered Yes refits the instructed pad; the bad-data
// dialog makes the operator reseat a loose connector.

#include <memory>

#include "platform/OperatorUi.h"
#include "sim/BenchHands.h"

namespace sim {

class SimulatedAnalyzer;

class SimulatedBench final : public platform::OperatorUi {
  public:
    // Both must outlive the bench.
    SimulatedBench(platform::OperatorUi& frontEnd, SimulatedAnalyzer& analyzer);
    // The front end must outlive the bench.
    SimulatedBench(platform::OperatorUi& frontEnd, std::unique_ptr<BenchHands> hands);

    platform::Answer messageBox(const platform::MessageBox& box) override;
    platform::BadDataChoice badDataChoice(const std::string& receiver) override;

  private:
    platform::OperatorUi& m_frontEnd;
    std::unique_ptr<BenchHands> m_hands;
};

}  // namespace sim
