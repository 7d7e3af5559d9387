#pragma once

// The desktop front end against the simulated analyzer in a fresh directory: the working
// directory (with the sample "RcvrChar.dat") is the process's current directory while the
// window runs.

#include <filesystem>
#include <memory>
#include <string>

#include "TempDir.h"
#include "frontends/qt/QtDialogFrontEnd.h"
#include "platform/Clock.h"
#include "platform/PathMap.h"
#include "platform/RunSignals.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"

namespace qttest {

class WindowBench {
  public:
    explicit WindowBench(const std::string& scenarioMembers = "");
    ~WindowBench();

    // Runs the front end; onWindow sets up the operator. Returns the exit status.
    int run(std::function<void(qtui::QtFrontEndParts&)> onWindow);

    std::filesystem::path workDir() const { return dir / "work"; }

    testsupport::TempDir dir;
    std::unique_ptr<sim::SimulatedAnalyzer> simulator;
    platform::VirtualClock clock;
    platform::DrivePathMap paths;
    std::unique_ptr<sim::SimProcessRunner> processes;
    platform::RunSignals signals;

  private:
    std::filesystem::path m_previousDirectory;
};

}  // namespace qttest
