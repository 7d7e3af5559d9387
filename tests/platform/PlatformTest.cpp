#include <gtest/gtest.h>

#include "ErrorOf.h"

#include "platform/Clock.h"
#include "platform/ErrorText.h"
#include "platform/PathMap.h"
#include "platform/RunSignals.h"
#include "platform/ScriptedOperatorUi.h"

using namespace platform;
using testsupport::errorOf;

namespace {

struct CollectingNotices : NoticeSink {
    std::vector<std::string> lines;
    void postnotice(const std::string& text) override { lines.push_back(text); }
};

}  // namespace

TEST(ErrorText, TakesStringsCharacterStringsAndStandardExceptions) {
    EXPECT_EQ(errorOf([] { throw std::string("as string"); }), "as string");
    EXPECT_EQ(errorOf([] { throw "No Model Set in CNAData::GetSequence"; }),
              "No Model Set in CNAData::GetSequence");
    EXPECT_EQ(errorOf([] { throw std::runtime_error("std"); }), "std");
    EXPECT_EQ(errorOf([] { throw 42; }), "Unknown error");
}

TEST(Clock, VirtualClockCountsWithoutSleeping) {
    VirtualClock clock;
    auto before = std::chrono::steady_clock::now();
    for (int i = 0; i < 100; ++i) {
        clock.wait(std::chrono::milliseconds(10000));
    }
    EXPECT_EQ(clock.totalWaited(), std::chrono::milliseconds(1000000));
    EXPECT_LT(std::chrono::steady_clock::now() - before, std::chrono::seconds(5));
}

TEST(PathMap, MapsDrivesAndWorkingDirectory) {
    DrivePathMap map("/work/dir");
    map.mapDrive('c', "/sim/C");
    EXPECT_EQ(map.toLocal("C:\\Program Files\\Velquor\\RcvrCharRef.dat"),
              std::filesystem::path("/sim/C/Program Files/Velquor/RcvrCharRef.dat"));
    EXPECT_EQ(map.toLocal(".\\FlashCommands.txt"),
              std::filesystem::path("/work/dir/FlashCommands.txt"));
    EXPECT_EQ(map.toLocal("\\rcvrCharRaw_A.txt"),
              std::filesystem::path("/work/dir/rcvrCharRaw_A.txt"));
    EXPECT_NE(errorOf([&] { map.toLocal("D:\\x"); }).find("D:\\x"), std::string::npos);
}

TEST(RunSignals, CheckabortUnwindsOnlyWhenRequested) {
    RunSignals signals;
    CollectingNotices notices;
    signals.workerRunning = true;
    EXPECT_NO_THROW(checkabort(signals, notices));
    EXPECT_TRUE(notices.lines.empty());
    signals.abortRequested = true;
    EXPECT_THROW(checkabort(signals, notices), WorkerAborted);
    EXPECT_FALSE(signals.workerRunning);
    EXPECT_EQ(notices.lines, std::vector<std::string>{"Characterization Aborted\r\n"});
}

TEST(ScriptedOperatorUi, AnswersInOrderRepeatsLastAndRefusesUnknownBoxes) {
    ScriptedOperatorUi ui;
    ui.answer("Connections", {Answer::Ok, Answer::Cancel});
    EXPECT_EQ(ui.messageBox({"t", "Connections", Buttons::OkCancel, BoxNone}), Answer::Ok);
    EXPECT_EQ(ui.messageBox({"t", "Connections", Buttons::OkCancel, BoxNone}), Answer::Cancel);
    EXPECT_EQ(ui.messageBox({"t", "Connections", Buttons::OkCancel, BoxNone}), Answer::Cancel);
    EXPECT_THROW(ui.messageBox({"t", "Other", Buttons::Ok, BoxNone}), std::string);
    ui.answerAll(Answer::Yes);
    EXPECT_EQ(ui.messageBox({"t", "Other", Buttons::YesNo, BoxNone}), Answer::Yes);
    EXPECT_EQ(ui.captions(),
              (std::vector<std::string>{"Connections", "Connections", "Connections", "Other"}));
}
