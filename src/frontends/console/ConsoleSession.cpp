#include "frontends/console/ConsoleSession.h"

#include <algorithm>

namespace console {

namespace {
platform::OperatorUi& chosenUi(const std::shared_ptr<platform::OperatorUi>& wrapped,
                               platform::OperatorUi& console) {
    return wrapped ? *wrapped : console;
}
}  // namespace

ConsoleSession::ConsoleSession(ConsoleSetup& setup, ConsoleOutput& output, app::UiTaskQueue& queue,
                               BoxAnswerer& answerer, bool interactive)
    : m_setup(setup),
      m_output(output),
      m_queue(queue),
      m_ui(answerer, output,
           [this] {
               // Let the worker stop at its next check point and the loop notice at once.
               m_setup.signals.abortRequested = true;
               m_queue.wake();
           }),
      m_wrappedUi(setup.wrapUi ? setup.wrapUi(m_ui) : nullptr),
      m_view(output, m_ui, interactive),
      m_services{
          chosenUi(m_wrappedUi, m_ui), setup.clock, setup.paths, setup.processes, setup.signals,
          setup.workingDirectory} {}

int ConsoleSession::run(const app::CTarvexApp::ModalLoop& loop) {
    app::CTarvexApp application(m_view, m_services, m_queue);
    try {
        return application.run(loop);
    } catch (const app::ProgramStop& stop) {
        return stop.status;
    }
}

void ConsoleSession::stopIfUnanswered() const {
    if (m_ui.stopped()) {
        throw app::ProgramStop{ConsoleOperatorUi::kUnansweredStatus};
    }
}

void ConsoleSession::step(app::CTarvexDlg& dlg, std::chrono::milliseconds maxWait) {
    using namespace std::chrono;
    auto wait = maxWait;
    if (const auto tick = m_view.nextTick()) {
        const auto untilTick = duration_cast<milliseconds>(*tick - ConsoleView::Clock::now());
        wait =
            dlg.workerRunning() ? std::clamp(untilTick, milliseconds(0), maxWait) : milliseconds(0);
    }
    m_queue.runPending(wait);
    stopIfUnanswered();
    if (const auto tick = m_view.nextTick();
        tick && (ConsoleView::Clock::now() >= *tick || !dlg.workerRunning())) {
        m_view.ticked();
        dlg.onTimer();
        stopIfUnanswered();
    }
}

void ConsoleSession::settle(app::CTarvexDlg& dlg) {
    while (!dlg.ended() && !dlg.idle()) {
        step(dlg, std::chrono::milliseconds(1000));
    }
}

}  // namespace console
