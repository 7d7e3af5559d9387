#pragma once

// The dialog in a desktop window: the Qt counterpart of the console front end. Runs the
// application (start-up, the modal dialog, the restart) with the window as its view and
// Qt message boxes as its operator interface; completed receivers are plotted beside it.

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <ostream>
#include <string>

#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "platform/ProcessRunner.h"
#include "platform/RunSignals.h"

namespace qtui {

class TarvexWindow;
class QtOperatorUi;
class CharacterizationWindow;

// The windows of one run of the front end.
struct QtFrontEndParts {
    TarvexWindow& window;
    QtOperatorUi& ui;
    CharacterizationWindow& plots;
};

struct QtSetup {
    platform::Clock& clock;
    const platform::PathMap& paths;
    platform::ProcessRunner& processes;
    platform::RunSignals& signals;
    std::filesystem::path workingDirectory;
    // Puts something between the window's boxes and the dialog (the simulated bench that
    // plays the operator's cabling); the window's own boxes when empty.
    std::function<std::shared_ptr<platform::OperatorUi>(platform::OperatorUi& qt)> wrapUi;
    // Called once the window exists, before the dialog initialises (tests drive it from
    // here; the executable leaves it empty).
    std::function<void(QtFrontEndParts& parts)> onWindow;
    // The analyzer's *IDN? reply, shown in the window's title; the plain title when empty.
    std::string instrument;
};

// Why no window can be opened here, or nothing when a display is available. Looks at
// QT_QPA_PLATFORM, WAYLAND_DISPLAY and DISPLAY (a local X display must have its socket).
std::optional<std::string> missingDisplay();

// Runs the dialog in a window and returns the exit status (README, "Exit status"). Creates
// the QApplication when there is none; without a display it writes why to err and
// returns 1.
int runQtDialog(QtSetup& setup, std::ostream& err);

}  // namespace qtui
