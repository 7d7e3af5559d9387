#pragma once

// The platform pieces the dialog and its runs work with, provided by whoever starts the
// application (the executable, a test). They must outlive the dialog.

#include <filesystem>
#include <string>

#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"
#include "platform/RunSignals.h"

namespace app {

struct DialogServices {
    // Every message box and the bad-data dialog, from the UI thread and from the worker.
    platform::OperatorUi& ui;
    platform::Clock& clock;
    // ".\\" files to the working directory, "C:\\..." to the analyzer computer's drive.
    const platform::PathMap& paths;
    platform::ProcessRunner& processes;
    platform::RunSignals& signals;
    // The process's current directory: "RcvrChar.dat" is read from here, and the raw
    // exports, the result files and "FlashCommands.txt" are written here.
    std::filesystem::path workingDirectory;
};

// Thrown by a front end to end the program at once with an exit status (for example a
// box that nobody may answer); the application ends the dialog orderly, without the
// restart, and lets it pass.
struct ProgramStop {
    int status = 1;
};

}  // namespace app
