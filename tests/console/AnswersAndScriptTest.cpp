#include <gtest/gtest.h>

#include "frontends/console/AnswerBook.h"
#include "frontends/console/OperatorScript.h"

using namespace console;

namespace {

std::string errorOf(const std::function<void()>& action) {
    try {
        action();
    } catch (const std::string& text) {
        return text;
    }
    return "no error";
}

const std::vector<AnswerWord> kYesNo{AnswerWord::Yes, AnswerWord::No};
const std::vector<AnswerWord> kOk{AnswerWord::Ok};
const std::vector<AnswerWord> kBadData{AnswerWord::Retest, AnswerWord::Quit, AnswerWord::Continue};

}  // namespace

TEST(AnswerBook, AnswersOfACaptionAreUsedInOrderAndTheLastRepeats) {
    AnswerBook book = AnswerBook::parse(
        "# operator who agrees, then thinks again\n"
        "Reload now? = Yes, no ,YES\r\n"
        "\n"
        "Characterization data issue! = Retest, Continue\n"
        "* = OK\n");
    std::string reason;
    EXPECT_EQ(book.next("Reload now?", kYesNo, reason), AnswerWord::Yes);
    EXPECT_EQ(book.next("Reload now?", kYesNo, reason), AnswerWord::No);
    EXPECT_EQ(book.next("Reload now?", kYesNo, reason), AnswerWord::Yes);
    EXPECT_EQ(book.next("Reload now?", kYesNo, reason), AnswerWord::Yes);
    EXPECT_EQ(book.next("Characterization data issue!", kBadData, reason), AnswerWord::Retest);
    EXPECT_EQ(book.next("Characterization data issue!", kBadData, reason), AnswerWord::Continue);
    EXPECT_EQ(book.next("Some Cals Deferred", kOk, reason), AnswerWord::Ok);
}

TEST(AnswerBook, NeverGuessesWhenNoRuleFits) {
    AnswerBook book = AnswerBook::parse("Abort now? = OK\n");
    std::string reason;
    EXPECT_FALSE(book.next("Delete previous calibrations?", kYesNo, reason));
    EXPECT_EQ(reason, "no rule answers the caption \"Delete previous calibrations?\"");
    EXPECT_FALSE(book.next("Abort now?", kYesNo, reason));
    EXPECT_EQ(reason, "the rule for \"Abort now?\" answers OK, but the box offers Yes, No");

    AnswerBook defaults = AnswerBook::parse("* = Yes\n");
    EXPECT_FALSE(defaults.next("Some Cals Deferred", kOk, reason));
    EXPECT_EQ(reason, "the default rule \"*\" answers Yes, but the box offers OK");
}

TEST(AnswerBook, YesToAllTakesTheAgreeingButtonOfEachKindOfBox) {
    AnswerBook book = AnswerBook::yesToAll();
    std::string reason;
    EXPECT_EQ(book.next("Reload now?", kYesNo, reason), AnswerWord::Yes);
    EXPECT_EQ(book.next("Error", kOk, reason), AnswerWord::Ok);
    EXPECT_EQ(book.next("x", {AnswerWord::Ok, AnswerWord::Cancel}, reason), AnswerWord::Ok);
    EXPECT_EQ(book.next("Characterization data issue!", kBadData, reason), AnswerWord::Continue);
}

TEST(AnswerBook, MalformedFilesAreRejectedWithTheLine) {
    EXPECT_EQ(errorOf([] { AnswerBook::parse("Reload now? Yes\n"); }),
              "answers line 1: expected CAPTION = ANSWER[, ANSWER...], got \"Reload now? Yes\"");
    EXPECT_EQ(errorOf([] { AnswerBook::parse("\nReload now? = Maybe\n"); }),
              "answers line 2: \"Maybe\" is not an answer (Yes, No, OK, Cancel, Retest, Quit, "
              "Continue)");
    EXPECT_EQ(errorOf([] { AnswerBook::parse("Error = OK\nError = OK\n"); }),
              "answers line 2: a second rule for the caption \"Error\"");
    EXPECT_EQ(errorOf([] { AnswerBook::parse("* = OK\n* = Yes\n"); }),
              "answers line 2: a second default rule \"* = ...\"");
    EXPECT_EQ(errorOf([] { AnswerBook::parse("Error = \n"); }),
              "answers line 1: no answer given for \"Error\"");
}

TEST(OperatorScript, ParsesEveryActionAndTriggers) {
    const auto script = parseOperatorScript(
        "clear\n"
        "select R1, R1 LOW FREQUENCY EXTENSION,A\n"
        "  # comment\n"
        "on Cal(s) to complete after reload: abort\n"
        "run\nwait\nexport\nabout\nselectall\nexit\nclose\n");
    ASSERT_EQ(script.size(), 10u);
    EXPECT_EQ(script[0].action.kind, ScriptAction::Kind::Clear);
    EXPECT_EQ(script[1].action.kind, ScriptAction::Kind::Select);
    EXPECT_EQ(script[1].action.names,
              (std::vector<std::string>{"R1", "R1 LOW FREQUENCY EXTENSION", "A"}));
    EXPECT_EQ(script[2].number, 4);
    EXPECT_EQ(script[2].trigger, "Cal(s) to complete after reload");
    EXPECT_EQ(script[2].action.kind, ScriptAction::Kind::Abort);
    EXPECT_FALSE(script[3].trigger);
    EXPECT_EQ(actionText(script[1].action), "select R1,R1 LOW FREQUENCY EXTENSION,A");
    EXPECT_EQ(script[9].action.kind, ScriptAction::Kind::Close);
}

TEST(OperatorScript, MistakesNameTheLine) {
    EXPECT_EQ(errorOf([] { parseOperatorScript("run\nlaunch\n"); }),
              "script line 2: unknown action \"launch\" (selectall, clear, select, run, wait, "
              "export, about, abort, exit, close, on)");
    EXPECT_EQ(errorOf([] { parseOperatorScript("select\n"); }),
              "script line 1: select needs at least one receiver name");
    EXPECT_EQ(errorOf([] { parseOperatorScript("select A,,B\n"); }),
              "script line 1: select needs receiver names separated by commas");
    EXPECT_EQ(errorOf([] { parseOperatorScript("run now\n"); }),
              "script line 1: run takes no argument, got \"now\"");
    EXPECT_EQ(errorOf([] { parseOperatorScript("on Cal Complete: wait\n"); }),
              "script line 1: wait cannot be the action of on");
    EXPECT_EQ(errorOf([] { parseOperatorScript("on : exit\n"); }),
              "script line 1: on needs the text of a notice before \":\"");
    EXPECT_EQ(errorOf([] { parseOperatorScript("on Cal Complete exit\n"); }),
              "script line 1: expected on TEXT: ACTION");
}
