#include <gtest/gtest.h>

#include <filesystem>

#include "app/CTarvexApp.h"

#include "ConsoleRun.h"

using testsupport::ConsoleRun;

namespace {

std::string storedScenario(const std::string& storedJson) {
    return R"({"options": "010,080", "stored": [)" + storedJson + "]}";
}

std::string stored(const std::string& receiver, long records) {
    return R"({"receiver": ")" + receiver + R"(", "age_days": 1, "records": )" +
           std::to_string(records) + "}";
}

const std::string kOperator =
    "Connections = OK\n"
    "Some Cals Deferred = OK\n"
    "Reload TVA cals and continue now? = Yes\n"
    "Reload now? = Yes\n"
    "Delete previous calibrations? = Yes\n"
    "Exit without finishing cal? = Yes\n";

}  // namespace

TEST(ThreadedDialogEndToEnd, TracedRunCharacterizesR1ThenTheDeferredAAndRestarts) {
    ConsoleRun run;
    ASSERT_EQ(run.run("clear\nselect R1,A\nrun\nwait\n", kOperator), 0) << run.err();
    EXPECT_TRUE(run.inOrder({
        "This Characterization will run in two parts: first R channels, then port receivers.\n",
        "[Some Cals Deferred] NOTE: The following receivers will be calibrated later, following "
        "a reload of cal data from flash: A => OK\n",
        "Cal(s) to complete after reload: A\n",
        "Cal Started\n",
        "Started Cal R1\n",
        "[Connections] ",
        "Cal Complete\n",
        "First set of cals complete, will apply the cals to finish.\n",
        "[Reload TVA cals and continue now?] The cal will automatically reload cals on the TVA "
        "before calibrating receiver(s): A\nWould you like to continue? => Yes\n",
        "[Reload now?] ",
        "Started Cal A\n",
        "Cal Complete\n",
        "All requested cals complete, click Exit to apply.\n",
        "[Exit without finishing cal?] You have not successfully calibrated receiver(s): B, C, "
        "D, R2, R3, R4\nDo you really want to exit now? => Yes\n",
        "[Restart] Restarting TVA Application\n",
    })) << run.out();
    EXPECT_FALSE(run.has("Started Cal B"));
    // Each worker ran after its own preparation, both images went into flash, and the
    // analyzer application was restarted at the end.
    EXPECT_EQ(run.transcriptMatching("DIAG:FLASHARRAY \"RcvrChar\",\"R1\"").size(), 1u);
    EXPECT_EQ(run.transcriptMatching("DIAG:FLASHARRAY \"RcvrChar\",\"A\"").size(), 1u);
    EXPECT_EQ(run.transcriptMatching("restart application").size(), 1u);
    EXPECT_GT(run.clock().totalWaited().count(), 0);
    const std::string flashLog = testsupport::readFile(run.dir() / "FlashCommands.txt");
    EXPECT_EQ(flashLog.rfind("Initialized file\r\n", 0), 0u);
    EXPECT_NE(flashLog.find("After diag fcal load  \r\ndiag:mm:data:push 1,0\r\n"),
              std::string::npos);
}

TEST(DialogRunRules, NothingSelectedStillAsksToReloadAndExitsWithoutRestart) {
    ConsoleRun run;
    ASSERT_EQ(run.run("clear\nrun\n", "Reload now? = No\n"), 0) << run.err();
    EXPECT_TRUE(
        run.has("[Reload now?] The cal will automatically reload cal data from flash "
                "before calibrating the selected receiver(s).\nWould you like to "
                "continue? => No\n"));
    EXPECT_FALSE(run.has("Cal Started"));
    EXPECT_FALSE(run.has("[Restart]"));
    EXPECT_TRUE(run.transcriptMatching("restart application").empty());
}

TEST(ThreadedDialogRunRules, PortReceiverWithoutItsStoredReferenceGetsItAddedAndStops) {
    ConsoleRun run;
    // The first Run adds R1 and stops; the second, from the adjusted selection, splits.
    // The aborted first run did not store what it measured.
    ASSERT_EQ(run.run("clear\nselect A\nrun\non Started Cal R1: abort\nrun\nwait\n",
                      kOperator + "Cal selections adjusted = OK\nAbort now? = Yes\n"),
              app::CTarvexApp::exitRunFailed)
        << run.err();
    EXPECT_TRUE(run.inOrder({
        "[Cal selections adjusted] There is no cal data saved for receiver 'R1', upon which the "
        "cal for receiver A depends.\nThe cal has been added to selected cals, click 'Run "
        "Characterization' again to begin calibration.\n => OK\n",
        "[Some Cals Deferred] NOTE: The following receivers will be calibrated later, following "
        "a reload of cal data from flash: A => OK\n",
        "Started Cal R1\n",
        "[Abort now?] Are you sure you want to abort? => Yes\n",
        "Abort Requested\n",
        "Characterization Aborted\n",
    })) << run.out();
    // An aborted run discards the deferred part and reports no completion.
    EXPECT_FALSE(run.has("Cal Complete"));
    EXPECT_FALSE(run.has("First set of cals complete"));
    EXPECT_FALSE(run.has("All requested cals complete"));
    EXPECT_FALSE(run.has("Writing Cal File"));
}

TEST(ThreadedDialogRunRules, StoredPortReceiverWithStoredReferenceIsErasedReloadedAndRun) {
    const long records = testsupport::sampleRecordCount();
    ConsoleRun run(storedScenario(stored("R1", records) + "," + stored("A", records)));
    ASSERT_EQ(run.run("clear\nselect A\nrun\nwait\n", kOperator), 0) << run.err();
    EXPECT_TRUE(run.inOrder({
        "[Delete previous calibrations?] Receiver Characterization must erase the previous cal "
        "before calibrating some receivers.\n\nIs it OK to delete the previous calibrations for "
        "receiver(s) A? => Yes\n",
        "[Reload now?] ",
        "Started Cal A\n",
        "Cal Complete\n",
        "All requested cals complete, click Exit to apply.\n",
    })) << run.out();
    EXPECT_FALSE(run.has("Some Cals Deferred"));
    EXPECT_FALSE(run.has("Cal selections adjusted"));
    EXPECT_EQ(run.transcriptMatching("DIAG:FLASH:file:erase \"RCVRCHAR\",\"A\"").size(), 1u);
}

TEST(DialogRunRules, NoToTheDeleteQuestionErasesNothing) {
    const long records = testsupport::sampleRecordCount();
    ConsoleRun run(storedScenario(stored("R1", records) + "," + stored("A", records)));
    ASSERT_EQ(
        run.run("clear\nselect A\nrun\n", "Delete previous calibrations? = No\nReload now? = No\n"),
        0)
        << run.err();
    EXPECT_TRUE(run.inOrder({"[Delete previous calibrations?] ", "=> No\n", "[Reload now?] "}));
    EXPECT_FALSE(run.has("Cal Started"));
    EXPECT_TRUE(run.transcriptMatching("erase").empty());
    EXPECT_FALSE(run.has("[Restart]"));
}

TEST(DialogRunRules, OldSizedImageOfAnUnselectedReceiverIsAddedErasedAndStops) {
    const long records = testsupport::sampleRecordCount();
    ConsoleRun run(storedScenario(stored("R1", records) +
                                  R"(,{"receiver": "R2", "age_days": 20, "words": 500})"));
    ASSERT_EQ(run.run("clear\nselect R1\nrun\n", kOperator + "Cal selections adjusted = OK\n"), 0)
        << run.err();
    EXPECT_TRUE(run.inOrder({
        "[Delete previous calibrations?] Due to a change in the calibration points, old cals "
        "must be erased.\nReceiver Characterization must erase the previous cal before "
        "calibrating some receivers.\n\nIs it OK to delete the previous calibrations for "
        "receiver(s) R2? => Yes\n",
        "[Reload now?] ",
        "[Cal selections adjusted] Due to a change in the calibration points, all receivers "
        "with old cals need to be calibrated\nAny old cals not selected have been added to "
        "selected cals, click 'Run Characterization' again to begin calibration.\n => OK\n",
    })) << run.out();
    EXPECT_FALSE(run.has("Cal Started"));
    EXPECT_EQ(run.transcriptMatching("DIAG:FLASH:file:erase \"RCVRCHAR\",\"R2\"").size(), 1u);
    // The erase set the restart flag; R2 (erased) is not "nothing found", so the exit
    // question names only the receivers never characterized.
    EXPECT_TRUE(run.has("[Restart] Restarting TVA Application"));
}

TEST(ThreadedDialogMonitoring, CloseAndExitDuringARunStopTheWorkerBeforeTheDialogEnds) {
    for (const std::string action : {"close", "exit"}) {
        ConsoleRun run;
        ASSERT_EQ(run.run("clear\nselect R1\non Started Cal R1: " + action + "\nrun\n", kOperator),
                  app::CTarvexApp::exitRunFailed)
            << run.err();
        EXPECT_TRUE(run.inOrder({
            "Started Cal R1\n",
            "Aborting Characterization\n",
            "Characterization Aborted\n",
            "[Exit without finishing cal?] You have not successfully calibrated receiver(s): A, "
            "B, C, D, R1, R2, R3, R4\n",
            "[Restart] Restarting TVA Application\n",
        })) << action
            << "\n"
            << run.out();
        EXPECT_FALSE(run.has("Writing Cal File")) << action;
        EXPECT_FALSE(run.has("All requested cals complete")) << action;
    }
}

TEST(ThreadedDialogMonitoring, AbortAnsweredNoChangesNothing) {
    ConsoleRun run;
    ASSERT_EQ(run.run("clear\nselect R1\non Started Cal R1: abort\nrun\nwait\n",
                      kOperator + "Abort now? = No\n"),
              0)
        << run.err();
    EXPECT_TRUE(run.inOrder({"[Abort now?] Are you sure you want to abort? => No\n",
                             "Cal Complete\n", "All requested cals complete"}))
        << run.out();
    EXPECT_FALSE(run.has("Abort Requested"));
}

TEST(ThreadedDialogBadData, TheThreeChoicesOfTheBadDataDialog) {
    const std::string scenario = R"({"options": "010,080", "faults": {"bad_data": {"R1": 1}}})";
    const std::string script = "clear\nselect R1\nrun\nwait\n";
    const std::string prompt =
        "[Characterization data issue!] The characterization data just taken for receiver R1 "
        "appears to be bad.  Please select an action: => ";
    {
        ConsoleRun run(scenario);
        ASSERT_EQ(run.run(script, kOperator + "Characterization data issue! = Retest\n"
                                              "Please Note = OK\n"),
                  0)
            << run.err();
        EXPECT_TRUE(run.inOrder({prompt + "Retest\n",
                                 "[Please Note] Before retesting this "
                                 "receiver, please:\n",
                                 "Cal will be repeated\n", "Started Cal R1\n", "Cal Complete\n"}))
            << run.out();
    }
    {
        ConsoleRun run(scenario);
        ASSERT_EQ(run.run(script, kOperator + "Characterization data issue! = Quit\nError = OK\n"),
                  app::CTarvexApp::exitRunFailed)
            << run.err();
        EXPECT_TRUE(run.inOrder({prompt + "Quit\n",
                                 "[Error] User aborted characterization due to bad data on "
                                 "receiver R1 => OK\n",
                                 "Error in Cal\n"}))
            << run.out();
        EXPECT_FALSE(run.has("Cal Complete"));
    }
    {
        ConsoleRun run(scenario);
        ASSERT_EQ(run.run(script, kOperator + "Characterization data issue! = Continue\n"
                                              "Warning = OK\n"),
                  0)
            << run.err();
        EXPECT_TRUE(run.inOrder({prompt + "Continue\n",
                                 "[Warning] The characterization for receiver R1 has been "
                                 "defaulted.",
                                 "Cal Complete\n"}))
            << run.out();
        EXPECT_FALSE(run.has("Please Note"));
    }
}

TEST(DialogStartUp, MissingConfigurationEndsTheDialogWithItsErrorBox) {
    ConsoleRun run(ConsoleRun::defaultScenario(), false);
    EXPECT_EQ(run.run("run\n", "Error = OK\n"), 1);
    // The connected instrument comes first, so that an error is seen beside it.
    EXPECT_EQ(run.out(),
              "Analyzer: Velquor Technologies,T3872A,MY00000001,A.13.55.06\n"
              "[Error] CNAData::ReadSequence Can't open file RcvrChar.dat => OK\n");
}

TEST(DialogStartUp, AccessoriesFollowTheModelAndTheReferencePad) {
    {
        ConsoleRun run(ConsoleRun::scenarioFile("two-port.json"));
        ASSERT_EQ(run.runYes("exit\n"), 0) << run.err();
        EXPECT_EQ(run.out().find("\nFor this Characterization you will need:\n1)  RF cable with "
                                 "3.5mm connectors (F-F or M-F)\n2)  3.5mm adapter (M-M), if "
                                 "using F-F cable\n3) Short (4\") flex RF cable with 3.5mm "
                                 "connectors (M-M)\n4) 3.5mm 10dB pad\n"),
                  run.out().find('\n'))
            << run.out();
    }
    {
        ConsoleRun run(ConsoleRun::scenarioFile("mmwave-broadband.json"));
        ASSERT_EQ(run.runYes("about\n"), 0) << run.err();
        EXPECT_NE(run.out().find("RF cable with 1.0mm connectors"), std::string::npos) << run.out();
        EXPECT_NE(run.out().find("[About Receiver Characterization] 13.55.06.0\n"),
                  std::string::npos);
    }
}

TEST(DialogConsole, ABoxWithoutAnAnswerEndsWithStatusFourAndNamesIt) {
    ConsoleRun run;
    EXPECT_EQ(run.run("clear\nselect R1,A\nrun\nwait\n", "Connections = OK\n"), 4);
    EXPECT_EQ(run.err(),
              "rcvrchar: no answer for the box [Some Cals Deferred] NOTE: The following receivers "
              "will be calibrated later, following a reload of cal data from flash: A\n(no rule "
              "answers the caption \"Some Cals Deferred\")\n");
    EXPECT_FALSE(run.has("Cal Started"));
    EXPECT_TRUE(run.transcriptMatching("restart application").empty());
}

TEST(ThreadedDialogConsole, AnUnansweredWorkerBoxStopsTheRunToo) {
    ConsoleRun run;
    EXPECT_EQ(run.run("clear\nselect R1\nrun\nwait\n", "Reload now? = Yes\n"), 4);
    EXPECT_NE(run.err().find("rcvrchar: no answer for the box [Connections] "), std::string::npos)
        << run.err();
    EXPECT_FALSE(run.has("Cal Complete"));
}

TEST(DialogConsole, UnknownReceiverInTheScriptEndsWithStatusOne) {
    ConsoleRun run;
    EXPECT_EQ(run.runYes("select R1,Z\nrun\n"), 1);
    EXPECT_EQ(run.err(),
              "rcvrchar: script line 1: no receiver named \"Z\" in the list (R1, R2, R3, R4, A, "
              "B, C, D)\n");
    EXPECT_FALSE(run.has("Cal Started"));
}

// A flash copy that does not read back as written fails the run: the receiver is not
// counted as characterized and the dialog ends with the failed-run status.
TEST(ThreadedDialogEndToEnd, FlashThatDoesNotReadBackAsWrittenFailsTheRun) {
    ConsoleRun run(R"({"options": "010,080", "faults": {"corrupt_flash_writes": {"R1": 1}}})");
    ASSERT_EQ(run.run("clear\nselect R1\nrun\nwait\n", kOperator + "Error = OK\n"),
              app::CTarvexApp::exitRunFailed)
        << run.err();
    EXPECT_TRUE(run.inOrder({"Writing Cal File\n",
                             "[Error] The characterization of R1 did not read back from flash as "
                             "written (word ",
                             "); it is not counted as stored. => OK\n", "Error in Cal\n"}))
        << run.out();
    EXPECT_FALSE(run.has("Cal Complete"));
}

// Unattended, a failed step is repeated at most --max-retries times per receiver; then the
// answer that stops repeating is given: No to a retry question, Quit for bad data (never
// a defaulted characterization of known-bad data).
TEST(ThreadedDialogUnattended, RetriesAreBoundedPerReceiverAndStep) {
    {
        ConsoleRun run(R"({"options": "010,080", "faults": {"disconnected": {"R1": 50}}})");
        ASSERT_EQ(run.runYes("clear\nselect R1\nrun\nwait\n"), 0) << run.err();
        const std::string retry = "[Check Connection] Receiver R1 In does not seem";
        EXPECT_TRUE(
            run.inOrder({retry, "=> Yes\n", retry, "=> Yes\n", retry, "=> Yes\n", retry, "=> No\n",
                         "Unattended: R1 connection already repeated 3 times "
                         "(--max-retries), answered No\n"}))
            << run.out();
    }
    {
        ConsoleRun run(R"({"options": "010,080", "faults": {"bad_data": {"R1": 50}}})");
        ASSERT_EQ(run.run("clear\nselect R1\nrun\nwait\n",
                          kOperator + "Characterization data issue! = Retest\nPlease Note = OK\n"
                                      "Error = OK\n"),
                  app::CTarvexApp::exitRunFailed)
            << run.err();
        EXPECT_TRUE(run.inOrder({"Retest\n", "Retest\n", "Retest\n", "=> Quit\n",
                                 "Unattended: R1 data already repeated 3 times", "Error in Cal\n"}))
            << run.out();
        EXPECT_FALSE(run.has("Cal Complete"));
    }
}

// --yes with every shipped scenario ends by itself.
TEST(ThreadedDialogUnattended, EveryShippedScenarioEndsUnderYes) {
    for (const auto& entry : std::filesystem::directory_iterator(
             std::filesystem::path(RCVRCHAR_SOURCE_DIR) / "data" / "scenarios")) {
        SCOPED_TRACE(entry.path().filename().string());
        ConsoleRun run(ConsoleRun::scenarioFile(entry.path().filename().string()));
        EXPECT_EQ(run.runYes("selectall\nrun\nwait\n"), 0) << run.err();
        EXPECT_TRUE(run.has("Cal Complete")) << run.out();
    }
}
