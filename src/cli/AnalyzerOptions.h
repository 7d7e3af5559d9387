#pragma once

// The options every command that reaches the analyzer shares, and what they set up: the
// working directory, the analyzer back end (the simulator, optionally from a scenario file)
// with its state directory, the clock of the fixed waits and a trace of the analyzer traffic.

#include <CLI/CLI.hpp>
#include <filesystem>
#include <memory>
#include <string>

#include "platform/Clock.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"

namespace sim {
class SimulatedAnalyzer;
}

namespace cli {

struct AnalyzerOptions {
    std::string workdir = ".";
    // "sim" or "sim:SCENARIO.json".
    std::string analyzer = "sim";
    // Empty: "analyzer-sim" in the working directory.
    std::string simState;
    // "virtual" (waits only counted, the default against the simulator) or "real".
    std::string clock = "virtual";
    // Empty: no trace.
    std::string trace;
};

// Adds --workdir, --analyzer, --sim-state, --clock and --trace to the command; the values
// already in `options` are the defaults.
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
    sim::SimulatedAnalyzer& simulator() { return *m_simulator; }

  private:
    std::filesystem::path m_workingDirectory;
    std::shared_ptr<platform::Clock> m_clock;
    platform::DrivePathMap m_paths;
    std::unique_ptr<sim::SimulatedAnalyzer> m_simulator;
    std::unique_ptr<platform::ProcessRunner> m_processes;
};

}  // namespace cli
