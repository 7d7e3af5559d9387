#pragma once

// The options every command that reaches the analyzer shares, and what they set up: the
// working directory, the analyzer back end (the simulator, optionally from a scenario file)
// with its state directory, the clock of the fixed waits and a trace of the analyzer traffic.

#include <CLI/CLI.hpp>
#include <filesystem>
#include <memory>
#include <string>

#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"

namespace sim {
class SimulatedAnalyzer;
}
namespace remote {
class ScpiLink;
class RemoteDrive;
}  // namespace remote

namespace cli {

struct AnalyzerOptions {
    std::string workdir = ".";
    // "sim", "sim:SCENARIO.json", or a LAN resource string (TCPIP::HOST::PORT::SOCKET,
    // TCPIP::HOST::inst0::INSTR).
    std::string analyzer = "sim";
    // Seconds each reply of a LAN analyzer may take.
    double timeout = 10;
    // Empty: "analyzer-sim" in the working directory.
    std::string simState;
    // "virtual" (waits only counted) or "real"; empty: virtual for the in-process simulator,
    // real for a LAN analyzer.
    std::string clock;
    // Empty: no trace.
    std::string trace;
};

// Adds --workdir, --analyzer, --timeout, --sim-state, --clock and --trace to the command;
// the values already in `options` are the defaults.
void addAnalyzerOptions(CLI::App& command, AnalyzerOptions& options);

// The analyzer and platform pieces the options describe. Creating it registers the simulator
// as the process's default analyzer back end, so that a proxy built with the empty host name
// reaches it.
class AnalyzerSession {
  public:
    // Raises an error text naming the option when a value cannot be used.
    explicit AnalyzerSession(const AnalyzerOptions& options);
    ~AnalyzerSession();
    AnalyzerSession(const AnalyzerSession&) = delete;
    AnalyzerSession& operator=(const AnalyzerSession&) = delete;

    const std::filesystem::path& workingDirectory() const { return m_workingDirectory; }
    platform::Clock& clock() { return *m_clock; }
    // ".\\" and relative paths to the working directory, "C:\\..." to the simulator's drive.
    const platform::DrivePathMap& paths() const { return m_paths; }
    platform::ProcessRunner& processes() { return *m_processes; }
    // The operator's hands at a simulated bench around the front end's boxes; nullptr for a
    // real analyzer, whose cabling the operator does.
    std::shared_ptr<platform::OperatorUi> wrapUi(platform::OperatorUi& frontEnd);
    // True when the waits are counted, not slept.
    bool virtualClock() const { return m_virtualClock; }
    // The in-process simulator; nullptr for a LAN analyzer.
    sim::SimulatedAnalyzer* simulator() { return m_simulator.get(); }
    // The connected instrument's *IDN? reply (the in-process simulator's too).
    const std::string& identification() const { return m_identification; }

  private:
    void openLan(const AnalyzerOptions& options);

    std::filesystem::path m_workingDirectory;
    std::shared_ptr<platform::Clock> m_clock;
    platform::DrivePathMap m_paths;
    std::unique_ptr<sim::SimulatedAnalyzer> m_simulator;
    std::shared_ptr<remote::ScpiLink> m_link;
    std::unique_ptr<remote::RemoteDrive> m_drive;
    bool m_servedSimulator = false;
    bool m_virtualClock = false;
    std::string m_identification;
    std::unique_ptr<platform::ProcessRunner> m_processes;
};

}  // namespace cli
