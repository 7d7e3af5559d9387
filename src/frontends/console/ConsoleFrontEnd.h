#pragma once

// The dialog in a terminal. Scripted: the operator's actions come from a script and the
// boxes are answered from an answers file (or --yes); every notice and every box is
// written to standard output. Interactive: the operator types the buttons as commands and
// answers each box at its prompt.
//
// Both return the exit status (README, "Exit status"): 0, 1 when an error text ended the
// dialog (or the script named a receiver that is not in the list), 3 when a run failed,
// 4 when a box could not be answered.

#include <atomic>
#include <filesystem>
#include <functional>
#include <memory>
#include <ostream>
#include <string>
#include <vector>

#include "frontends/console/AnswerBook.h"
#include "frontends/console/LineSource.h"
#include "frontends/console/OperatorScript.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"
#include "platform/RunSignals.h"

namespace console {

struct ConsoleSetup {
    platform::Clock& clock;
    const platform::PathMap& paths;
    platform::ProcessRunner& processes;
    platform::RunSignals& signals;
    std::filesystem::path workingDirectory;
    // Puts something between the console's boxes and the dialog (the simulated bench that
    // plays the operator's cabling); the console's own operator interface when empty.
    std::function<std::shared_ptr<platform::OperatorUi>(platform::OperatorUi& console)> wrapUi;
    // The analyzer's *IDN? reply, the console's first line; nothing shown when empty.
    std::string instrument;
};

// A retry question is answered Yes (bad data: Retest) at most maxRetries times for one
// receiver and step; then No (Quit).
int runScripted(ConsoleSetup& setup, const std::vector<ScriptLine>& script, AnswerBook answers,
                std::ostream& out, std::ostream& err, int maxRetries = 3);

// closeRequested (set by Ctrl-C) is read and cleared by the loop: it presses Close.
int runInteractive(ConsoleSetup& setup, LineSource& input, std::ostream& out, std::ostream& err,
                   std::atomic<bool>* closeRequested = nullptr);

}  // namespace console
