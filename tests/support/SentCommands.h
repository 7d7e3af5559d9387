#pragma once

#include <string>
#include <vector>

namespace sim {
class SimulatedAnalyzer;
}

namespace testsupport {

// The SCPI commands the simulator received, in order, without the error-queue polls.
std::vector<std::string> sentCommands(const sim::SimulatedAnalyzer& simulator);

}  // namespace testsupport
