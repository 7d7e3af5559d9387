#include "frontends/console/ConsoleOperatorUi.h"

#include "app/DialogServices.h"
#include "app/RcvrCharBadDlg.h"
#include "frontends/console/TextLines.h"

namespace console {

namespace {

std::vector<AnswerWord> wordsFor(platform::Buttons buttons) {
    switch (buttons) {
        case platform::Buttons::Ok:
            return {AnswerWord::Ok};
        case platform::Buttons::OkCancel:
            return {AnswerWord::Ok, AnswerWord::Cancel};
        case platform::Buttons::YesNo:
            return {AnswerWord::Yes, AnswerWord::No};
    }
    return {};
}

platform::Answer toAnswer(AnswerWord word) {
    switch (word) {
        case AnswerWord::Yes:
            return platform::Answer::Yes;
        case AnswerWord::No:
            return platform::Answer::No;
        case AnswerWord::Cancel:
            return platform::Answer::Cancel;
        default:
            return platform::Answer::Ok;
    }
}

}  // namespace

AnswerWord ConsoleOperatorUi::ask(const BoxQuestion& question) {
    if (m_stopped) {
        throw app::ProgramStop{kUnansweredStatus};
    }
    std::string reason;
    const auto word = m_answerer.answer(question, reason);
    if (word) {
        return *word;
    }
    if (!m_stopped.exchange(true)) {
        m_output.error("rcvrchar: no answer for the box [" + question.caption + "] " +
                       terminalLineEnds(question.text) + "\n(" + reason + ")\n");
        if (m_onStop) {
            m_onStop();
        }
    }
    throw app::ProgramStop{kUnansweredStatus};
}

platform::Answer ConsoleOperatorUi::messageBox(const platform::MessageBox& box) {
    return toAnswer(ask({box.caption, box.text, wordsFor(box.buttons), box.retryOf}));
}

platform::BadDataChoice ConsoleOperatorUi::badDataChoice(const std::string& receiver) {
    app::RcvrCharBadDlg dialog(receiver);
    // Quit stops retesting: unattended, a defaulted characterization of known-bad data
    // must never be stored.
    const AnswerWord word = ask({app::RcvrCharBadDlg::kTitle,
                                 dialog.promptText(),
                                 {AnswerWord::Retest, AnswerWord::Quit, AnswerWord::Continue},
                                 receiver + " data",
                                 AnswerWord::Retest,
                                 AnswerWord::Quit});
    const auto button = word == AnswerWord::Retest ? platform::BadDataChoice::Retest
                        : word == AnswerWord::Quit ? platform::BadDataChoice::Quit
                                                   : platform::BadDataChoice::Continue;
    dialog.press(button, *this);
    return dialog.choice();
}

}  // namespace console
