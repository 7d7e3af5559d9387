#pragma once

// The dialog in a terminal: notices go to standard output as they are appended; the list,
// buttons and timer are kept for the front end's loop; in interactive mode the list is
// shown with selection marks.

#include <chrono>
#include <functional>
#include <optional>

#include "app/DialogView.h"
#include "frontends/console/ConsoleOperatorUi.h"
#include "frontends/console/ConsoleOutput.h"

namespace console {

class ConsoleView final : public app::DialogView {
  public:
    using Clock = std::chrono::steady_clock;

    ConsoleView(ConsoleOutput& output, ConsoleOperatorUi& ui, bool interactive)
        : m_output(output), m_ui(ui), m_interactive(interactive) {}

    // Runs after each notice has been printed, still inside the notice handler.
    void setNoticeHook(std::function<void(const std::string&)> hook) { m_hook = std::move(hook); }

    void showReceivers(const std::vector<std::string>& names) override;
    void showSelection(const std::vector<bool>& selected) override;
    void appendLog(const std::string& text) override;
    void setRunEnabled(bool enabled) override { m_runEnabled = enabled; }
    void setAbortEnabled(bool enabled) override { m_abortEnabled = enabled; }
    void startTimer(std::chrono::milliseconds period) override;
    void stopTimer() override { m_nextTick.reset(); }
    void showAbout(const app::CAboutDlg& about) override;
    // The front end watches CTarvexDlg::ended() itself.
    void endDialog() override {}
    void showRestartNotice(const std::string& title, const std::string& text) override;
    void hideRestartNotice() override {}

    // The list with selection marks and numbers, as the interactive mode shows it.
    std::string listText() const;
    bool runEnabled() const { return m_runEnabled; }
    bool abortEnabled() const { return m_abortEnabled; }
    // When the timer is due next; nothing while it is stopped.
    std::optional<Clock::time_point> nextTick() const { return m_nextTick; }
    void ticked() { m_nextTick = Clock::now() + m_period; }

  private:
    ConsoleOutput& m_output;
    ConsoleOperatorUi& m_ui;
    bool m_interactive;
    std::function<void(const std::string&)> m_hook;
    std::vector<std::string> m_names;
    std::vector<bool> m_selected;
    bool m_selectionShown = false;
    bool m_runEnabled = true;
    bool m_abortEnabled = false;
    std::chrono::milliseconds m_period{1000};
    std::optional<Clock::time_point> m_nextTick;
};

}  // namespace console
