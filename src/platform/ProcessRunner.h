#pragma once

// Processes the system starts: the analyzer installation's restart program, and the
// command interpreter for "dir /-C" listings and "del" on millimetre-wave systems.

#include <string>

namespace platform {

class ProcessRunner {
  public:
    virtual ~ProcessRunner() = default;
    // Starts the program of the command line (e.g. "\"C:\\...\\restartapp.exe\"") and
    // waits for it to end; returns its exit code. Raises an error text when it cannot start.
    virtual int runProgram(const std::string& commandLine) = 0;
    // Runs one command of the command interpreter synchronously, e.g.
    // dir /-C "C:\...\RcvrCharRef.dat" > fileInfo.txt, or del "C:\...\RcvrCharRef.dat".
    virtual int runCommand(const std::string& command) = 0;
    // False when programs of the analyzer computer cannot be started from here (an
    // analyzer on the LAN): the operator must restart its application by hand.
    virtual bool runsPrograms() const { return true; }
};

}  // namespace platform
