#include "cli/AnalyzerOptions.h"

#include "sim/Scenario.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"

namespace cli {
namespace {

std::shared_ptr<platform::Clock> makeClock(const std::string& name) {
    if (name == "virtual") {
        return std::make_shared<platform::VirtualClock>();
    }
    if (name == "real") {
        return std::make_shared<platform::RealClock>();
    }
    throw std::string("--clock must be virtual or real, not \"" + name + "\"");
}

sim::Scenario scenarioOf(const std::string& analyzer) {
    if (analyzer == "sim") {
        return sim::Scenario();
    }
    if (analyzer.rfind("sim:", 0) == 0 && analyzer.size() > 4) {
        return sim::Scenario::fromFile(analyzer.substr(4));
    }
    throw std::string("--analyzer must be sim or sim:SCENARIO.json, not \"" + analyzer + "\"");
}

std::filesystem::path existingDirectory(const std::string& workdir) {
    std::error_code ec;
    if (!std::filesystem::is_directory(workdir, ec)) {
        throw std::string("--workdir " + workdir + " is not a directory");
    }
    return std::filesystem::absolute(workdir);
}

}  // namespace

void addAnalyzerOptions(CLI::App& command, AnalyzerOptions& options) {
    command.add_option("--workdir", options.workdir, "Working directory of the run")
        ->capture_default_str();
    command
        .add_option("--analyzer", options.analyzer,
                    "Analyzer back end: sim, or sim:SCENARIO.json for a scenario file")
        ->capture_default_str();
    command.add_option("--sim-state", options.simState,
                       "State directory of the simulated analyzer (default: analyzer-sim in "
                       "the working directory)");
    command.add_option("--clock", options.clock, "Fixed waits: real, or virtual (only counted)")
        ->check(CLI::IsMember({"virtual", "real"}))
        ->capture_default_str();
    command.add_option("--trace", options.trace, "Write every exchange with the analyzer here");
}

AnalyzerSession::AnalyzerSession(const AnalyzerOptions& options)
    : m_workingDirectory(existingDirectory(options.workdir)),
      m_clock(makeClock(options.clock)),
      m_paths(m_workingDirectory) {
    std::filesystem::path state = options.simState.empty()
                                      ? m_workingDirectory / "analyzer-sim"
                                      : std::filesystem::absolute(options.simState);
    m_simulator =
        std::make_unique<sim::SimulatedAnalyzer>(scenarioOf(options.analyzer), state, m_clock);
    if (!options.trace.empty()) {
        m_simulator->setTraceFile(options.trace);
    }
    m_paths.mapDrive('C', m_simulator->driveRoot());
    m_processes = std::make_unique<sim::SimProcessRunner>(*m_simulator, m_paths);
    m_simulator->registerAsBackend();
}

AnalyzerSession::~AnalyzerSession() = default;

}  // namespace cli
