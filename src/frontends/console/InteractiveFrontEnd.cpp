// The console front end on a terminal: buttons as commands, boxes as prompts.

#include <algorithm>
#include <cstdlib>

#include "frontends/console/ConsoleFrontEnd.h"
#include "frontends/console/ConsoleSession.h"
#include "frontends/console/DialogButtons.h"
#include "frontends/console/InteractiveAnswerer.h"
#include "frontends/console/TextLines.h"

namespace console {

namespace {

constexpr const char* kHelp =
    "Commands: run, abort, all (Select All), clear (Clear All), toggle N|NAME (or just N),\n"
    "          select NAME[,NAME...], list, export, about, exit; Ctrl-C closes the window.\n"
    "A box asks for its answer at its prompt; a box of the running characterization\n"
    "can wait while you type abort.\n";

std::string progressLine(const platform::RunStep& step) {
    return "  -- " + step.receiver + ": segment " + std::to_string(step.segment) + " of " +
           std::to_string(step.segments) + ", power level " + std::to_string(step.level) + " of " +
           std::to_string(step.levels) + "\n";
}

class InteractiveLoop {
  public:
    InteractiveLoop(ConsoleSession& session, InteractiveAnswerer& answerer, LineSource& input,
                    std::atomic<bool>* closeRequested, platform::RunSignals& signals)
        : m_session(session),
          m_answerer(answerer),
          m_input(input),
          m_close(closeRequested),
          m_signals(signals) {}

    void run(app::CTarvexDlg& dlg) {
        struct ReleaseWorkerBoxes {
            InteractiveAnswerer& answerer;
            ~ReleaseWorkerBoxes() { answerer.inputEnded(); }
        } release{m_answerer};

        m_session.view().setNoticeHook([this](const std::string& text) { progress(text); });
        // The dialog has ended, and its worker with it, before these are reset.
        m_signals.onStep = [this](const platform::RunStep& step) { showStep(step); };
        struct HookReset {
            ConsoleView& view;
            platform::RunSignals& signals;
            ~HookReset() {
                view.setNoticeHook(nullptr);
                signals.onStep = nullptr;
            }
        } reset{m_session.view(), m_signals};

        m_session.output().write(m_session.view().listText() + kHelp);
        bool exitPressed = false;
        while (!dlg.ended()) {
            m_session.step(dlg, std::chrono::milliseconds(0));
            if (m_close && m_close->exchange(false)) {
                m_session.output().write("\n(Close)\n");
                dlg.onClose();
                continue;
            }
            if (auto line = m_input.poll(std::chrono::milliseconds(50))) {
                if (!m_answerer.offer(*line)) {
                    command(dlg, trim(*line));
                }
                continue;
            }
            if (m_input.ended()) {
                // Nobody is left to type: leave as the end of a script does.
                m_answerer.inputEnded();
                if (!exitPressed) {
                    exitPressed = true;
                    dlg.onExit();
                } else if (dlg.idle()) {
                    dlg.onClose();
                }
            }
        }
    }

  private:
    void progress(const std::string& text) {
        if (text.rfind("Cal Started", 0) == 0) {
            m_started = 0;
            m_runBegan = std::chrono::steady_clock::now();
        } else if (text.rfind("Started Cal ", 0) == 0) {
            ++m_started;
            const auto seconds = std::chrono::duration_cast<std::chrono::seconds>(
                std::chrono::steady_clock::now() - m_runBegan);
            m_session.output().write("  -- receiver " + std::to_string(m_started) +
                                     " of this run, " + std::to_string(seconds.count()) +
                                     " s so far\n");
        }
    }

    // Worker thread. A line for each new segment, and otherwise at most one a second.
    void showStep(const platform::RunStep& step) {
        const auto now = std::chrono::steady_clock::now();
        if (step.level != 1 && now - m_stepShownAt < std::chrono::seconds(1)) {
            return;
        }
        m_stepShownAt = now;
        m_session.output().write(progressLine(step));
    }

    void command(app::CTarvexDlg& dlg, const std::string& line) {
        if (line.empty()) {
            return;
        }
        const auto space = line.find(' ');
        const std::string word = line.substr(0, space);
        const std::string rest = space == std::string::npos ? "" : trim(line.substr(space));
        if (std::all_of(line.begin(), line.end(),
                        [](unsigned char c) { return std::isdigit(c); })) {
            toggle(dlg, line);
        } else if (word == "toggle") {
            toggle(dlg, rest);
        } else if (word == "all") {
            dlg.onSelectAll();
        } else if (word == "list") {
            m_session.output().write(m_session.view().listText());
        } else if (word == "help") {
            m_session.output().write(kHelp);
        } else {
            scriptCommand(dlg, line);
        }
    }

    void scriptCommand(app::CTarvexDlg& dlg, const std::string& line) {
        ScriptAction action;
        try {
            action = parseScriptAction(line);
        } catch (const std::string& reason) {
            m_session.output().write(reason + "\n");
            return;
        }
        if (action.kind == ScriptAction::Kind::Select) {
            for (const auto& name : action.names) {
                select(dlg, name, true);
            }
        } else if (action.kind == ScriptAction::Kind::Wait) {
            m_session.output().write("wait is for scripts; the log shows the run\n");
        } else if (auto disabled = pressButton(dlg, action.kind)) {
            m_session.output().write(*disabled + "\n");
        }
    }

    void toggle(app::CTarvexDlg& dlg, const std::string& which) {
        const auto& receivers = dlg.receivers();
        const long number = std::strtol(which.c_str(), nullptr, 10);
        if (number >= 1 && static_cast<std::size_t>(number) <= receivers.size()) {
            const auto index = static_cast<std::size_t>(number - 1);
            dlg.setSelected(index, !dlg.selection()[index]);
            return;
        }
        const auto found = std::find(receivers.begin(), receivers.end(), which);
        if (found == receivers.end()) {
            m_session.output().write("No receiver \"" + which + "\" in the list\n");
            return;
        }
        const auto index = static_cast<std::size_t>(found - receivers.begin());
        dlg.setSelected(index, !dlg.selection()[index]);
    }

    void select(app::CTarvexDlg& dlg, const std::string& name, bool selected) {
        const auto& receivers = dlg.receivers();
        const auto found = std::find(receivers.begin(), receivers.end(), name);
        if (found == receivers.end()) {
            m_session.output().write("No receiver \"" + name + "\" in the list\n");
            return;
        }
        dlg.setSelected(static_cast<std::size_t>(found - receivers.begin()), selected);
    }

    ConsoleSession& m_session;
    InteractiveAnswerer& m_answerer;
    LineSource& m_input;
    std::atomic<bool>* m_close;
    platform::RunSignals& m_signals;
    int m_started = 0;
    // Used by the worker thread only.
    std::chrono::steady_clock::time_point m_stepShownAt;
    std::chrono::steady_clock::time_point m_runBegan = std::chrono::steady_clock::now();
};

}  // namespace

int runInteractive(ConsoleSetup& setup, LineSource& input, std::ostream& out, std::ostream& err,
                   std::atomic<bool>* closeRequested) {
    ConsoleOutput output(out, err);
    if (!setup.instrument.empty()) {
        output.write("Analyzer: " + setup.instrument + "\n");
    }
    app::UiTaskQueue queue;
    InteractiveAnswerer answerer(output, queue, input);
    ConsoleSession session(setup, output, queue, answerer, true);
    InteractiveLoop loop(session, answerer, input, closeRequested, setup.signals);
    return session.run([&](app::CTarvexDlg& dlg) { loop.run(dlg); });
}

}  // namespace console
