#include "SentCommands.h"

#include "sim/SimulatedAnalyzer.h"

namespace testsupport {

std::vector<std::string> sentCommands(const sim::SimulatedAnalyzer& simulator) {
    std::vector<std::string> sent;
    for (const auto& line : simulator.transcript()) {
        if (line.rfind("> ", 0) == 0 && line != "> SYST:ERR?") {
            sent.push_back(line.substr(2));
        }
    }
    return sent;
}

}  // namespace testsupport
