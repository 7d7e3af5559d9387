#pragma once

// One run of the console front end against a fresh simulated analyzer, in a temporary
// working directory holding the sample configuration.

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "TempDir.h"
#include "frontends/console/ConsoleFrontEnd.h"
#include "platform/Clock.h"
#include "platform/PathMap.h"
#include "platform/RunSignals.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"

namespace testsupport {

// Records of a characterization that matches the sample configuration's calibration points
// for a T3872A with options 010 and 080.
long sampleRecordCount();

// Whether the parts occur in text in this order, each after the end of the one before.
bool inOrder(const std::string& text, const std::vector<std::string>& expected);

class ConsoleRun {
  public:
    // scenario: JSON text of a simulator scenario.
    explicit ConsoleRun(const std::string& scenario = defaultScenario(),
                        bool withConfiguration = true);
    ~ConsoleRun();

    static std::string defaultScenario();
    static std::string scenarioFile(const std::string& name);

    // Runs the script with the answers file text (or --yes); returns the exit status.
    int run(const std::string& script, const std::string& answers);
    int runYes(const std::string& script);
    // The interactive front end, typed at by keyboard; writes to out, keeps the errors.
    int runInteractive(console::LineSource& keyboard, std::ostream& out);

    const std::string& out() const { return m_out; }
    const std::string& err() const { return m_err; }
    // The output lines in order, and whether `expected` occur among them in this order.
    bool inOrder(const std::vector<std::string>& expected) const {
        return testsupport::inOrder(m_out, expected);
    }
    bool has(const std::string& text) const { return m_out.find(text) != std::string::npos; }
    std::vector<std::string> transcriptMatching(const std::string& text) const;
    sim::SimulatedAnalyzer& simulator() { return *m_simulator; }
    const std::filesystem::path& dir() const { return m_dir.path(); }
    platform::VirtualClock& clock() { return *m_clock; }

  private:
    console::ConsoleSetup makeSetup();
    int runWith(const std::string& script, bool yes, const std::string& answers);

    TempDir m_dir;
    std::filesystem::path m_previousDirectory;
    std::shared_ptr<platform::VirtualClock> m_clock;
    std::unique_ptr<sim::SimulatedAnalyzer> m_simulator;
    std::unique_ptr<platform::DrivePathMap> m_paths;
    std::unique_ptr<sim::SimProcessRunner> m_processes;
    platform::RunSignals m_signals;
    std::string m_out;
    std::string m_err;
};

}  // namespace testsupport
