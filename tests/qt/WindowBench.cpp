#include "WindowBench.h"

#include <sstream>

#include "QtTestApplication.h"
#include "sim/SimulatedBench.h"

namespace qttest {

WindowBench::WindowBench(const std::string& scenarioMembers)
    : simulator(std::make_unique<sim::SimulatedAnalyzer>(
          sim::Scenario::fromJson("{" + scenarioMembers + "}"), dir / "analyzer")),
      paths(dir / "work"),
      m_previousDirectory(std::filesystem::current_path()) {
    qtApplication();
    std::filesystem::create_directories(workDir());
    std::filesystem::copy_file(testsupport::sampleConfiguration(), workDir() / "RcvrChar.dat");
    paths.mapDrive('C', simulator->driveRoot());
    simulator->registerAsBackend();
    processes = std::make_unique<sim::SimProcessRunner>(*simulator, paths);
    std::filesystem::current_path(workDir());
}

WindowBench::~WindowBench() {
    std::filesystem::current_path(m_previousDirectory);
}

int WindowBench::run(std::function<void(qtui::QtFrontEndParts&)> onWindow) {
    qtui::QtSetup setup{
        .clock = clock,
        .paths = paths,
        .processes = *processes,
        .signals = signals,
        .workingDirectory = workDir(),
        .wrapUi = [this](platform::OperatorUi& qt) -> std::shared_ptr<platform::OperatorUi> {
            return std::make_shared<sim::SimulatedBench>(qt, *simulator);
        },
        .onWindow = std::move(onWindow),
        .instrument = simulator->scenario().idn};
    std::ostringstream err;
    const int status = qtui::runQtDialog(setup, err);
    return status;
}

}  // namespace qttest
