#include "cli/AnalyzerOptions.h"

#include <cmath>

#include "analyzer/automation/BackendFactory.h"
#include "analyzer/remote/LanTransport.h"
#include "analyzer/remote/RemoteApplication.h"
#include "analyzer/remote/RemoteDrive.h"
#include "analyzer/remote/RemoteProcessRunner.h"
#include "analyzer/remote/ResourceString.h"
#include "sim/BenchHands.h"
#include "sim/Scenario.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"
#include "sim/SimulatedBench.h"

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
    throw std::string("--analyzer must be sim, sim:SCENARIO.json or a LAN resource string (" +
                      std::string(remote::acceptedResourceForms) + "), not \"" + analyzer + "\"");
}

std::filesystem::path existingDirectory(const std::string& workdir) {
    std::error_code ec;
    if (!std::filesystem::is_directory(workdir, ec)) {
        throw std::string("--workdir " + workdir + " is not a directory");
    }
    return std::filesystem::absolute(workdir);
}

std::chrono::milliseconds timeoutOf(double seconds) {
    if (!(seconds > 0 && seconds <= 3600)) {
        throw std::string("--timeout must be a number of seconds above 0 and at most 3600");
    }
    return std::chrono::milliseconds(std::llround(seconds * 1000));
}

}  // namespace

void addAnalyzerOptions(CLI::App& command, AnalyzerOptions& options) {
    command.add_option("--workdir", options.workdir, "Working directory of the run")
        ->capture_default_str();
    command
        .add_option("--analyzer", options.analyzer,
                    "Analyzer: sim, sim:SCENARIO.json for a scenario file, or an analyzer on the "
                    "LAN, TCPIP::HOST[::PORT]::SOCKET or TCPIP::HOST[::inst0]::INSTR")
        ->capture_default_str();
    command
        .add_option("--timeout", options.timeout,
                    "Seconds each reply of a LAN analyzer may take, e.g. --timeout 20")
        ->capture_default_str();
    command.add_option("--sim-state", options.simState,
                       "State directory of the simulated analyzer (default: analyzer-sim in "
                       "the working directory)");
    command
        .add_option("--clock", options.clock,
                    "Fixed waits: real, or virtual (only counted; the default for the built-in "
                    "simulator, refused for an analyzer on the LAN that is not one)")
        ->check(CLI::IsMember({"virtual", "real"}));
    command.add_option("--trace", options.trace, "Write every exchange with the analyzer here");
}

AnalyzerSession::AnalyzerSession(const AnalyzerOptions& options)
    : m_workingDirectory(existingDirectory(options.workdir)), m_paths(m_workingDirectory) {
    if (remote::isLanResource(options.analyzer)) {
        openLan(options);
        return;
    }
    m_virtualClock = options.clock != "real";
    m_clock = makeClock(m_virtualClock ? "virtual" : "real");
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
    m_identification = m_simulator->scenario().idn;
}

void AnalyzerSession::openLan(const AnalyzerOptions& options) {
    const remote::ResourceString resource = remote::parseResourceString(options.analyzer);
    const auto timeout = timeoutOf(options.timeout);
    m_link =
        std::make_shared<remote::ScpiLink>(remote::makeLanTransport(resource, timeout), timeout);
    if (!options.trace.empty()) {
        m_link->setTraceFile(options.trace);
    }
    // A simulator-only query beside *IDN?: a real analyzer answers only the second, and
    // its -113 for the first is cleared at once.
    const std::string reply = m_link->query("SIM:VERS?;*IDN?", "identifying the analyzer");
    m_servedSimulator = reply.rfind("1;", 0) == 0;
    m_identification = m_servedSimulator ? reply.substr(2) : reply;
    if (!m_servedSimulator) {
        m_link->command("*CLS", "clearing the simulator probe's error");
    }
    m_virtualClock = options.clock.empty() ? false : options.clock == "virtual";
    if (m_virtualClock && !m_servedSimulator) {
        throw std::string("--clock virtual is refused for " + options.analyzer + " (" +
                          m_identification +
                          "): it is not the rcvrchar simulator, and skipping the waits on a "
                          "real analyzer would measure garbage");
    }
    m_clock = makeClock(m_virtualClock ? "virtual" : "real");
    m_drive = std::make_unique<remote::RemoteDrive>(m_link);
    m_paths.mapDrive('C', *m_drive);
    m_processes = std::make_unique<remote::RemoteProcessRunner>(*m_drive, m_paths);
    std::shared_ptr<remote::ScpiLink> link = m_link;
    automation::BackendFactory::registerBackend(
        "lan", [link](const std::string&) { return remote::makeApplication(link); });
    automation::BackendFactory::setDefaultBackend("lan");
}

std::shared_ptr<platform::OperatorUi> AnalyzerSession::wrapUi(platform::OperatorUi& frontEnd) {
    if (m_simulator) {
        return std::make_shared<sim::SimulatedBench>(frontEnd, *m_simulator);
    }
    if (!m_servedSimulator) {
        return nullptr;
    }
    std::shared_ptr<remote::ScpiLink> link = m_link;
    return std::make_shared<sim::SimulatedBench>(
        frontEnd, sim::handsOverLink([link](const std::string& command) {
            link->command(command, "telling the simulator what the operator cabled");
        }));
}

AnalyzerSession::~AnalyzerSession() = default;

}  // namespace cli
