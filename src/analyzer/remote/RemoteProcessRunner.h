#pragma once

// The analyzer computer's command interpreter for an analyzer on the LAN: "dir /-C" listings
// written from the instrument's MMEM:CAT? in the format the catalog reads, and "del" as
// MMEM:DEL. Programs cannot be started there from here.

#include <memory>

#include "analyzer/remote/RemoteDrive.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"

namespace remote {

class RemoteProcessRunner final : public platform::ProcessRunner {
  public:
    // The listing's output file is written through `paths` (the working directory).
    RemoteProcessRunner(RemoteDrive& drive, const platform::PathMap& paths)
        : m_drive(drive), m_paths(paths) {}

    // Raises an error text: nothing on the analyzer computer can be started from here.
    int runProgram(const std::string& commandLine) override;
    int runCommand(const std::string& command) override;
    bool runsPrograms() const override { return false; }

  private:
    RemoteDrive& m_drive;
    const platform::PathMap& m_paths;
};

}  // namespace remote
