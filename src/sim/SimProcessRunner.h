#pragma once

// The analyzer computer's processes, simulated: the installation's restart program restarts
// the simulated application; the command interpreter lists one file ("dir /-C") in the
// Windows layout and deletes files ("del"). Windows paths are mapped to local files.

#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"

namespace sim {

class SimulatedAnalyzer;

class SimProcessRunner final : public platform::ProcessRunner {
  public:
    // The path map decides where "C:\..." and relative paths (the working directory) lie;
    // both must outlive the runner.
    SimProcessRunner(SimulatedAnalyzer& analyzer, const platform::PathMap& paths);

    // Only "<application directory>\restartapp.exe" exists: it restarts the application and
    // returns 0. Any other program raises "The system cannot find the file specified: ...".
    int runProgram(const std::string& commandLine) override;
    // dir /-C "<path>" [> <file>]: 0 when the file was listed, 1 when not found;
    // del "<path>": 0 when deleted, 1 when not found; anything else 9009.
    int runCommand(const std::string& command) override;

  private:
    int listFile(const std::string& windowsPath, const std::string& output);
    int deleteFile(const std::string& windowsPath);

    SimulatedAnalyzer& m_analyzer;
    const platform::PathMap& m_paths;
};

}  // namespace sim
