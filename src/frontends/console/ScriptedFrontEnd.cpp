// The console front end without a terminal: an operator script and an answers file.

#include <algorithm>

#include "frontends/console/ConsoleFrontEnd.h"
#include "frontends/console/ConsoleSession.h"
#include "frontends/console/DialogButtons.h"
#include "frontends/console/ScriptedAnswerer.h"

namespace console {

namespace {

using Kind = ScriptAction::Kind;

class ScriptPlayer {
  public:
    ScriptPlayer(ConsoleSession& session, const std::vector<ScriptLine>& script)
        : m_session(session), m_script(script) {}

    void play(app::CTarvexDlg& dlg) {
        // Triggers act only while the script plays, not while the dialog is shut down.
        struct HookReset {
            ConsoleView& view;
            ~HookReset() { view.setNoticeHook(nullptr); }
        } reset{m_session.view()};
        m_session.view().setNoticeHook([this, &dlg](const std::string& text) {
            for (auto& trigger : m_triggers) {
                if (!trigger.fired && text.find(*trigger.line->trigger) != std::string::npos) {
                    trigger.fired = true;
                    perform(dlg, *trigger.line);
                }
            }
        });
        for (const ScriptLine& line : m_script) {
            if (dlg.ended()) {
                m_session.output().error("rcvrchar: the dialog has ended; script line " +
                                         std::to_string(line.number) +
                                         " and those after it are not performed\n");
                break;
            }
            if (line.trigger) {
                m_triggers.push_back({&line, false});
                continue;
            }
            perform(dlg, line);
            m_session.step(dlg, std::chrono::milliseconds(0));
        }
        // The end of the script presses Exit; an exit question answered No leaves the
        // dialog open with nobody to press anything, so the window is closed then.
        if (!dlg.ended()) {
            dlg.onExit();
            m_session.settle(dlg);
        }
        if (!dlg.ended()) {
            dlg.onClose();
            m_session.settle(dlg);
        }
    }

  private:
    struct Trigger {
        const ScriptLine* line;
        bool fired;
    };

    void ignored(const ScriptLine& line, const std::string& why) {
        m_session.output().error("rcvrchar: script line " + std::to_string(line.number) + ": " +
                                 actionText(line.action) + " ignored, " + why + "\n");
    }

    void perform(app::CTarvexDlg& dlg, const ScriptLine& line) {
        if (line.action.kind == Kind::Select) {
            select(dlg, line);
        } else if (line.action.kind == Kind::Wait) {
            m_session.settle(dlg);
        } else if (auto disabled = pressButton(dlg, line.action.kind)) {
            ignored(line, *disabled);
        }
    }

    void select(app::CTarvexDlg& dlg, const ScriptLine& line) {
        const auto& receivers = dlg.receivers();
        for (const std::string& name : line.action.names) {
            const auto found = std::find(receivers.begin(), receivers.end(), name);
            if (found == receivers.end()) {
                std::string known;
                for (const auto& receiver : receivers) {
                    known += (known.empty() ? "" : ", ") + receiver;
                }
                m_session.output().error("rcvrchar: script line " + std::to_string(line.number) +
                                         ": no receiver named \"" + name + "\" in the list (" +
                                         known + ")\n");
                throw app::ProgramStop{1};
            }
            dlg.setSelected(static_cast<std::size_t>(found - receivers.begin()), true);
        }
    }

    ConsoleSession& m_session;
    const std::vector<ScriptLine>& m_script;
    std::vector<Trigger> m_triggers;
};

}  // namespace

int runScripted(ConsoleSetup& setup, const std::vector<ScriptLine>& script, AnswerBook answers,
                std::ostream& out, std::ostream& err, int maxRetries) {
    ConsoleOutput output(out, err);
    if (!setup.instrument.empty()) {
        output.write("Analyzer: " + setup.instrument + "\n");
    }
    app::UiTaskQueue queue;
    ScriptedAnswerer answerer(std::move(answers), output, maxRetries);
    ConsoleSession session(setup, output, queue, answerer, false);
    ScriptPlayer player(session, script);
    return session.run([&](app::CTarvexDlg& dlg) { player.play(dlg); });
}

}  // namespace console
