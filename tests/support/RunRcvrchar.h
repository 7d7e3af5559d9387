#pragma once

// Runs the built executable as a user would, from inside a temporary directory.

#include <string>

#include "TempDir.h"

namespace clitest {

struct CommandRun {
    int status;
    std::string out;
    std::string err;
};

// arguments are shell-quoted already; standard input comes from the text given.
CommandRun runRcvrchar(const testsupport::TempDir& dir, const std::string& arguments,
                       const std::string& input = "");

// The sample configuration's path, quoted for the shell.
std::string quotedSample();

}  // namespace clitest
