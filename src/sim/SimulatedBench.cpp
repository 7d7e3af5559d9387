#include "sim/SimulatedBench.h"

#include "sim/BenchInstructions.h"
#include "sim/Instrument.h"
#include "sim/SimulatedAnalyzer.h"

namespace sim {

SimulatedBench::SimulatedBench(platform::OperatorUi& frontEnd, SimulatedAnalyzer& analyzer)
    : SimulatedBench(frontEnd, handsOn(analyzer.instrument())) {}

SimulatedBench::SimulatedBench(platform::OperatorUi& frontEnd, std::unique_ptr<BenchHands> hands)
    : m_frontEnd(frontEnd), m_hands(std::move(hands)) {}

platform::Answer SimulatedBench::messageBox(const platform::MessageBox& box) {
    platform::Answer answer = m_frontEnd.messageBox(box);
    if (box.caption == "Connections") {
        auto cables = readConnectionInstructions(box.text);
        if (!cables.empty()) {
            m_hands->cable(cables);
        }
    } else if (box.caption == "Check Connection" && answer == platform::Answer::Yes) {
        // Checking the connection, the operator also makes sure the instructed pad is fitted.
        if (auto receiver = receiverOfConnectionComplaint(box.text)) {
            m_hands->recheckConnection(*receiver);
            m_hands->recheckPad(*receiver);
        }
    } else if (box.caption == "Unexpected power ratio reading" && answer == platform::Answer::Yes) {
        for (const auto& cable : readConnectionInstructions(box.text)) {
            m_hands->recheckPad(cable.receiver);
        }
    }
    return answer;
}

platform::BadDataChoice SimulatedBench::badDataChoice(const std::string& receiver) {
    platform::BadDataChoice choice = m_frontEnd.badDataChoice(receiver);
    m_hands->reseatConnector(instrumentReceiver(receiver));
    return choice;
}

}  // namespace sim
