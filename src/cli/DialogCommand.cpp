// The executable without a subcommand: the "Receiver Characterization" dialog in the
// terminal, or driven by an operator script without one.

#include <unistd.h>

#include <atomic>
#include <csignal>
#include <fstream>
#include <iostream>
#include <sstream>

#include "cli/AnalyzerOptions.h"
#include "cli/CommandRegistry.h"
#include "cli/GuiCommand.h"
#include "cli/WorkFolderLock.h"
#include "frontends/console/ConsoleFrontEnd.h"
#include "platform/RunSignals.h"
#include "sim/SimulatedAnalyzer.h"

namespace {

constexpr const char* kDescription = R"(Receiver characterization dialog.

On a terminal the dialog is interactive: the receiver list with selection marks, the
log as it grows, the buttons as commands (run, abort, all, clear, toggle N, export,
about, exit; Ctrl-C closes) and every message box as a prompt.

Without a terminal (or with --script) it is driven by an operator script, one action
a line: selectall, clear, select NAME[,NAME...], run, wait, export, about, abort,
exit, close, and "on TEXT: ACTION" (ACTION once, when a notice containing TEXT is
logged). At the end of the script Exit is pressed. Boxes are answered from --answers
(lines "CAPTION = ANSWER[, ANSWER...]", "* = ANSWER" as default; answers Yes, No, OK,
Cancel, Retest, Quit, Continue) or --yes. Notices and boxes ("[CAPTION] TEXT => ANSWER")
go to standard output.

Exit status: 0 the dialog ended by Exit or Close and every run finished, 1 an error
ended the dialog, 3 it ended normally but a run ended on an error ("Error in Cal") or was
aborted, or a file could not be written (named in the log and an "Error" box), 4 a box had
no answer (its caption and text on stderr).

Before a stored characterization is erased or replaced it is saved under backups/ in the
working directory (rcvrchar backups, rcvrchar restore); earlier attempts' raw files go to
history/.

Example:
  printf 'clear\nselect R1,A\nrun\nwait\n' |
    rcvrchar --workdir demo --analyzer sim:data/scenarios/default.json --yes)";

std::atomic<bool> g_closeRequested{false};

extern "C" void onInterrupt(int) {
    g_closeRequested = true;
}

std::string readWhole(const std::string& path, const std::string& what) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        throw std::string("Cannot read the " + what + " \"" + path + "\"");
    }
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

struct DialogOptions {
    cli::AnalyzerOptions analyzer;
    std::string script;
    std::string answers;
    bool yes = false;
    bool gui = false;
    int maxRetries = 3;
};

int runDialog(const DialogOptions& options) {
    const cli::WorkFolderLocks locks(options.analyzer, "the dialog");
    if (options.gui) {
        return cli::runGuiDialog(options.analyzer);
    }
    const bool scripted = !options.script.empty() || !::isatty(STDIN_FILENO);
    std::vector<console::ScriptLine> script;
    std::optional<console::AnswerBook> answers;
    if (scripted) {
        const std::string text = options.script.empty()
                                     ? std::string(std::istreambuf_iterator<char>(std::cin), {})
                                     : readWhole(options.script, "operator script");
        script = console::parseOperatorScript(text);
    }
    if (options.yes) {
        answers = console::AnswerBook::yesToAll();
    } else if (!options.answers.empty()) {
        answers = console::AnswerBook::parse(readWhole(options.answers, "answers file"));
    }
    if (scripted && !answers) {
        answers = console::AnswerBook::parse("");
    }

    cli::AnalyzerSession session(options.analyzer);
    // The dialog reads "RcvrChar.dat" and writes its files in the current directory.
    std::filesystem::current_path(session.workingDirectory());

    platform::RunSignals signals;
    console::ConsoleSetup setup{
        session.clock(),
        session.paths(),
        session.processes(),
        signals,
        std::filesystem::current_path(),
        [&session](platform::OperatorUi& frontEnd) { return session.wrapUi(frontEnd); },
        session.identification(),
    };
    int status = 0;
    if (scripted) {
        status = console::runScripted(setup, script, std::move(*answers), std::cout, std::cerr,
                                      options.maxRetries);
    } else {
        std::signal(SIGINT, onInterrupt);
        console::FdLineSource input(STDIN_FILENO);
        status = console::runInteractive(setup, input, std::cout, std::cerr, &g_closeRequested);
        std::signal(SIGINT, SIG_DFL);
    }
    if (session.virtualClock()) {
        const auto waited = std::chrono::duration_cast<std::chrono::duration<double>>(
            session.clock().totalWaited());
        std::cerr << "rcvrchar: protocol waits counted by the virtual clock: " << waited.count()
                  << " s\n";
    }
    return status;
}

const cli::CommandRegistration registration{
    "", [](CLI::App& app) -> std::function<int()> {
        auto options = std::make_shared<DialogOptions>();
        app.description(kDescription);
        cli::addAnalyzerOptions(app, options->analyzer);
        app.add_option("--script", options->script,
                       "Operator script, one action a line (default: standard input when it is "
                       "not a terminal), e.g. --script run.txt");
        auto* answers =
            app.add_option("--answers", options->answers,
                           "Answers for the boxes: CAPTION = ANSWER[, ANSWER...] lines, "
                           "e.g. --answers answers.txt");
        app.add_flag("--yes", options->yes,
                     "Answer every box with Yes or OK and the bad-data dialog with Continue")
            ->excludes(answers);
        app.add_option("--max-retries", options->maxRetries,
                       "Unattended runs: how often one receiver's failed step is repeated "
                       "(Retry? answered Yes, bad data Retest) before No or Quit is answered")
            ->check(CLI::Range(0, 1000))
            ->capture_default_str();
        app.add_flag("--gui", options->gui,
                     "Open the dialog in a desktop window instead of the terminal (needs a "
                     "display), e.g. rcvrchar --gui --workdir bench");
        return [options] { return runDialog(*options); };
    }};

}  // namespace
