#pragma once

// The view port of the "Receiver Characterization" dialog: what a toolkit (a terminal, a
// desktop window, a test's fake) must show for CTarvexDlg. Every call arrives on the UI
// thread. The controller keeps the state; the view only shows it and hands the operator's
// actions back to the controller's handlers (onRun, onAbort, setSelected, ...).

#include <chrono>
#include <string>
#include <vector>

#include "app/CAboutDlg.h"

namespace app {

class DialogView {
  public:
    virtual ~DialogView() = default;

    // The receiver list box: its items in order (called once, at initialisation) ...
    virtual void showReceivers(const std::vector<std::string>& names) = 0;
    // ... and which of them are selected (one flag per item), after every change. Changes the
    // operator makes come back through CTarvexDlg::setSelected, which calls this again.
    virtual void showSelection(const std::vector<bool>& selected) = 0;

    // Appends one notice at the end of the log box; the text carries its own "\r\n".
    virtual void appendLog(const std::string& text) = 0;

    // "&Run Characterization" and "&Abort Cal".
    virtual void setRunEnabled(bool enabled) = 0;
    virtual void setAbortEnabled(bool enabled) = 0;

    // Timer 1: from startTimer until stopTimer the front end calls CTarvexDlg::onTimer on
    // the UI thread once per period. It may call it earlier when woken (the worker ended);
    // an early tick is harmless.
    virtual void startTimer(std::chrono::milliseconds period) = 0;
    virtual void stopTimer() = 0;

    // The modal About box; returns once the operator has closed it.
    virtual void showAbout(const CAboutDlg& about) = 0;

    // The modal run of the dialog has ended (Exit, Close); the front end leaves its loop.
    virtual void endDialog() = 0;

    // After the dialog has ended: the "Restart" notice window while the analyzer
    // application restarts, shown without blocking and hidden when the restart is done.
    virtual void showRestartNotice(const std::string& title, const std::string& text) = 0;
    virtual void hideRestartNotice() = 0;
};

}  // namespace app
