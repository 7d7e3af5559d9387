#include "sim/SimulatedBench.h"

#include "sim/BenchInstructions.h"
#include "sim/Instrument.h"
#include "sim/SimulatedAnalyzer.h"

namespace sim {

SimulatedBench::SimulatedBench(platform::OperatorUi& frontEnd, SimulatedAnalyzer& analyzer)
    : m_frontEnd(frontEnd), m_analyzer(analyzer) {}

platform::Answer SimulatedBench::messageBox(const platform::MessageBox& box) {
    platform::Answer answer = m_frontEnd.messageBox(box);
    Instrument& instrument = m_analyzer.instrument();
    if (box.caption == "Connections") {
        auto cables = readConnectionInstructions(box.text);
        if (!cables.empty()) {
            instrument.cableReceivers(cables);
        }
    } else if (box.caption == "Check Connection" && answer == platform::Answer::Yes) {
        // Checking the connection, the operator also makes sure the instructed pad is fitted.
        if (auto receiver = receiverOfConnectionComplaint(box.text)) {
            instrument.operatorRecheckedConnection(*receiver);
            instrument.operatorRecheckedPad(*receiver);
        }
    } else if (box.caption == "Unexpected power ratio reading" && answer == platform::Answer::Yes) {
        for (const auto& cable : readConnectionInstructions(box.text)) {
            instrument.operatorRecheckedPad(cable.receiver);
        }
    }
    return answer;
}

platform::BadDataChoice SimulatedBench::badDataChoice(const std::string& receiver) {
    platform::BadDataChoice choice = m_frontEnd.badDataChoice(receiver);
    m_analyzer.instrument().operatorSawBadData(instrumentReceiver(receiver));
    return choice;
}

}  // namespace sim
