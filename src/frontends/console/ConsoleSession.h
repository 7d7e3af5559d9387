#pragma once

// What both console modes share: the UI thread's queue, the output, the operator
// interface, the view and the application, and the loop step that serves the worker's
// notices and the dialog's timer.

#include <chrono>
#include <memory>

#include "app/CTarvexApp.h"
#include "frontends/console/ConsoleFrontEnd.h"
#include "frontends/console/ConsoleOperatorUi.h"
#include "frontends/console/ConsoleOutput.h"
#include "frontends/console/ConsoleView.h"

namespace console {

class ConsoleSession {
  public:
    ConsoleSession(ConsoleSetup& setup, ConsoleOutput& output, app::UiTaskQueue& queue,
                   BoxAnswerer& answerer, bool interactive);

    // Runs the application with the modal loop; returns the exit status.
    int run(const app::CTarvexApp::ModalLoop& loop);

    // One step of the modal loop: runs the UI work handed in (waiting up to maxWait for
    // some) and the timer when it is due, or at once when the worker has ended.
    void step(app::CTarvexDlg& dlg, std::chrono::milliseconds maxWait);
    // Steps until the dialog is idle (no worker, timer stopped) or has ended.
    void settle(app::CTarvexDlg& dlg);
    // Throws ProgramStop when a box went unanswered.
    void stopIfUnanswered() const;

    ConsoleView& view() { return m_view; }
    ConsoleOutput& output() { return m_output; }
    ConsoleOperatorUi& ui() { return m_ui; }

  private:
    ConsoleSetup& m_setup;
    ConsoleOutput& m_output;
    app::UiTaskQueue& m_queue;
    ConsoleOperatorUi m_ui;
    std::shared_ptr<platform::OperatorUi> m_wrappedUi;
    ConsoleView m_view;
    app::DialogServices m_services;
};

}  // namespace console
