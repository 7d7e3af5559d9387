#pragma once

// The application from start to end: runs the dialog modally in a front end's loop, shows
// an error text that ended it in the "Error" box, and afterwards restarts the analyzer
// application when a run has been started, so that the new characterizations are used.

#include <functional>

#include "app/CTarvexDlg.h"

namespace app {

class CTarvexApp {
  public:
    static constexpr int exitRunFailed = 3;

    // The front end's modal loop: handles the operator's actions, the UI work handed in by
    // the worker and the dialog's timer until dlg.ended().
    using ModalLoop = std::function<void(CTarvexDlg& dlg)>;

    CTarvexApp(DialogView& view, DialogServices& services, UiTaskQueue& queue)
        : m_view(view), m_services(services), m_queue(queue) {}

    // Returns the exit status: 0 when the dialog ended by Exit or Close and every run it
    // started finished, 1 when an error text (or the analyzer's "Critical Error") ended it,
    // 3 when it ended normally but a run ended on an error or an abort, or a file could not be
    // written. A ProgramStop from
    // the front end passes through after the dialog has been shut down, without the restart.
    int run(const ModalLoop& modalLoop);

    // The restart program's command line for an application directory.
    static std::string restartCommandLine(const std::string& applicationDirectory);

  private:
    void restartAnalyzerApplication(const std::string& applicationDirectory);

    DialogView& m_view;
    DialogServices& m_services;
    UiTaskQueue& m_queue;
};

}  // namespace app
