#include "frontends/console/ConsoleView.h"

#include "frontends/console/TextLines.h"

namespace console {

void ConsoleView::showReceivers(const std::vector<std::string>& names) {
    m_names = names;
    m_selected.assign(names.size(), false);
}

void ConsoleView::showSelection(const std::vector<bool>& selected) {
    // The first selection comes with the list, which the loop shows with its help.
    const bool changed = m_selectionShown && selected != m_selected;
    m_selectionShown = true;
    m_selected = selected;
    if (m_interactive && changed) {
        m_output.write(listText());
    }
}

std::string ConsoleView::listText() const {
    std::string text = "Please select the receivers to characterize\n";
    for (std::size_t i = 0; i < m_names.size(); ++i) {
        text += std::string("  ") + (m_selected[i] ? "[x] " : "[ ] ") + std::to_string(i + 1) +
                "  " + m_names[i] + "\n";
    }
    return text;
}

void ConsoleView::appendLog(const std::string& text) {
    m_output.write(terminalLineEnds(text));
    if (m_hook) {
        m_hook(text);
    }
}

void ConsoleView::startTimer(std::chrono::milliseconds period) {
    m_period = period;
    m_nextTick = Clock::now() + period;
}

void ConsoleView::showAbout(const app::CAboutDlg& about) {
    m_ui.ask({app::CAboutDlg::kTitle,
              about.versionText() + "\n" + about.ownershipText(),
              {AnswerWord::Ok}});
}

void ConsoleView::showRestartNotice(const std::string& title, const std::string& text) {
    m_output.write("[" + title + "] " + text + "\n");
}

}  // namespace console
