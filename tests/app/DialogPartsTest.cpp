#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "app/AccessoriesText.h"
#include "app/CAboutDlg.h"
#include "app/CTarvexApp.h"
#include "app/DialogNotices.h"
#include "app/RcvrCharBadDlg.h"
#include "app/UiTaskQueue.h"
#include "platform/ScriptedOperatorUi.h"

using namespace app;

TEST(AccessoriesText, ConnectorFollowsTheModelFirstMatchWinning) {
    EXPECT_EQ(connectorType("T3951A"), "1.0mm");
    EXPECT_EQ(connectorType("T3872B"), "3.5mm");
    EXPECT_EQ(connectorType("T3871A"), "3.5mm");
    EXPECT_EQ(connectorType("T3462A"), "3.5mm");
    EXPECT_EQ(connectorType("T3877A"), "1.85mm");
    EXPECT_EQ(connectorType("T3467B"), "1.85mm");
    EXPECT_EQ(connectorType("X9999"), "2.4mm");
}

TEST(AccessoriesText, DirectSearchListsPadsOnlyWhenTheReferencePadIsSet) {
    const std::string withoutPad = accessoriesText("Direct-Search", false, "3.5mm", 0);
    EXPECT_EQ(withoutPad,
              "For this Characterization you will need:\r\n1)  RF cable with 3.5mm connectors "
              "(F-F or M-F)\r\n2)  3.5mm adapter (M-M), if using F-F cable\r\n");
    EXPECT_EQ(
        accessoriesText("Direct-Search", false, "3.5mm", 10),
        withoutPad +
            "3) Short (4\") flex RF cable with 3.5mm connectors (M-M)\r\n4) 3.5mm 10dB pad\r\n");
}

TEST(AccessoriesText, PortSearchTellsOfTwoPartsWhenReferenceReceiversComeFirst) {
    EXPECT_EQ(accessoriesText("Port-Search", true, "2.4mm", 20),
              "This Characterization will run in two parts: first R channels, then port "
              "receivers.\r\nAccessories you will need:\r\n1)  RF cable with 2.4mm connectors "
              "(F-F)\r\n2)  2.4mm pad(s) totalling approximately 20dB\r\n");
    EXPECT_EQ(accessoriesText("Port-Search", false, "1.0mm", 20),
              "For this Characterization you will need:\r\n1)  RF cable with 1.0mm connectors "
              "(F-F)\r\n ");
}

TEST(SmallDialogs, BadDataDialogNamesTheReceiverAndRecordsTheButton) {
    platform::ScriptedOperatorUi ui;
    ui.answerAll(platform::Answer::Ok);

    RcvrCharBadDlg retest("B");
    EXPECT_EQ(retest.promptText(),
              "The characterization data just taken for receiver B appears to be bad.  Please "
              "select an action:");
    EXPECT_EQ(retest.retestLabel(), "Retest Receiver B");
    retest.press(platform::BadDataChoice::Retest, ui);
    EXPECT_TRUE(retest.retestChosen());
    EXPECT_EQ(retest.choice(), platform::BadDataChoice::Retest);
    ASSERT_EQ(ui.boxes().size(), 1u);
    EXPECT_EQ(ui.boxes()[0].box.caption, "Please Note");
    EXPECT_NE(ui.boxes()[0].box.text.find("  6)  As test is running do NOT disturb unit or "
                                          "cable\n\nPress OK to continue."),
              std::string::npos);

    RcvrCharBadDlg quit("A");
    quit.press(platform::BadDataChoice::Quit, ui);
    EXPECT_FALSE(quit.retestChosen());
    EXPECT_TRUE(quit.quitChosen());
    EXPECT_EQ(quit.choice(), platform::BadDataChoice::Quit);

    RcvrCharBadDlg closed("C");
    EXPECT_EQ(closed.choice(), platform::BadDataChoice::Continue);
    EXPECT_EQ(ui.boxes().size(), 1u) << "only Retest shows the note";
}

TEST(SmallDialogs, AboutBoxShowsTheProductVersionAndRestartHasItsCommandLine) {
    CAboutDlg about;
    EXPECT_EQ(about.versionText(), "Receiver Characterization Version 3.0");
    about.initialize();
    EXPECT_EQ(about.versionText(), "13.55.06.0");
    EXPECT_EQ(CTarvexApp::restartCommandLine("C:\\Program Files (x86)\\Velquor\\Network Analyzer"),
              "\"C:\\Program Files (x86)\\Velquor\\Network Analyzer\\restartapp.exe\"");
}

TEST(ThreadedUiTaskQueue, WorkerNoticesArriveInOrderOnTheUiThreadAndWaitForIt) {
    UiTaskQueue queue;
    std::vector<std::string> log;
    std::vector<bool> onUi;
    DialogNotices notices(queue, [&](const std::string& text) {
        log.push_back(text);
        onUi.push_back(queue.onUiThread());
    });
    std::atomic<int> returned{0};
    std::thread worker([&] {
        for (int i = 0; i < 50; ++i) {
            notices.postnotice("line " + std::to_string(i) + "\r\n");
            // Synchronous: the line is in the log before postnotice returns.
            returned = i + 1;
        }
    });
    while (returned < 50) {
        queue.runPending(std::chrono::milliseconds(10));
        EXPECT_LE(static_cast<std::size_t>(returned.load()), log.size());
    }
    worker.join();
    ASSERT_EQ(log.size(), 50u);
    EXPECT_EQ(log.front(), "line 0\r\n");
    EXPECT_EQ(log.back(), "line 49\r\n");
    EXPECT_TRUE(std::all_of(onUi.begin(), onUi.end(), [](bool b) { return b; }));

    // On the UI thread itself a notice is appended at once.
    notices.postnotice("direct\r\n");
    EXPECT_EQ(log.back(), "direct\r\n");
}

TEST(ThreadedUiTaskQueue, ATaskThatThrowsStillReleasesItsCallerAndKeepsTheRest) {
    UiTaskQueue queue;
    std::vector<int> ran;
    std::atomic<int> released{0};
    std::thread first([&] {
        queue.runSynchronously([] { throw std::string("stop"); });
        ++released;
    });
    while (released == 0) {
        try {
            queue.runPending(std::chrono::milliseconds(10));
        } catch (const std::string& text) {
            EXPECT_EQ(text, "stop");
        }
    }
    first.join();
    queue.post([&] { ran.push_back(1); });
    queue.post([&] { ran.push_back(2); });
    EXPECT_TRUE(queue.runPending(std::chrono::milliseconds(0)));
    EXPECT_EQ(ran, (std::vector<int>{1, 2}));
    // A wake alone ends the wait early and reports it.
    std::thread waker([&] { queue.wake(); });
    EXPECT_TRUE(queue.runPending(std::chrono::seconds(5)));
    waker.join();
    EXPECT_FALSE(queue.runPending(std::chrono::milliseconds(0)));
}
