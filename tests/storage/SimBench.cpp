#include "SimBench.h"
#include "SentCommands.h"

#include <gtest/gtest.h>

namespace storagetest {

SimBench::SimBench(const std::string& scenarioMembers)
    : simulator(std::make_unique<sim::SimulatedAnalyzer>(
          sim::Scenario::fromJson("{" + scenarioMembers + "}"), dir / "analyzer")),
      paths(dir / "work"),
      log(paths) {
    std::filesystem::create_directories(workDir());
    paths.mapDrive('C', simulator->driveRoot());
    simulator->registerAsBackend();
    analyzer = std::make_unique<CNetworkAnalyzer>("", ui, clock);
    analyzer->readmodel(true);
    log.create();
    simProcesses = std::make_unique<sim::SimProcessRunner>(*simulator, paths);
    processes = std::make_unique<RecordingProcesses>(*simProcesses);
    simulator->clearTranscript();
}

std::vector<std::string> SimBench::commands() const {
    return testsupport::sentCommands(*simulator);
}

std::vector<std::string> SimBench::logLines() const {
    std::string text = testsupport::readFile(workDir() / "FlashCommands.txt");
    std::vector<std::string> lines;
    for (std::size_t pos = 0, end; pos < text.size(); pos = end + 2) {
        end = text.find("\r\n", pos);
        if (end == std::string::npos) {
            ADD_FAILURE() << "log line without CR LF: " << text.substr(pos);
            break;
        }
        lines.push_back(text.substr(pos, end - pos));
    }
    return lines;
}

}  // namespace storagetest
