// The characterization run through the LAN back end, over an in-memory link onto the same
// simulated instrument: the flash and every file it writes must match the in-process run's.

#include <gtest/gtest.h>

#include <fstream>
#include <map>

#include "SimRun.h"

using enginetest::SimRun;

namespace {

// Every file under the folder, by relative path, with its bytes.
std::map<std::string, std::string> filesUnder(const std::filesystem::path& root) {
    std::map<std::string, std::string> files;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root)) {
        if (entry.is_regular_file()) {
            files[std::filesystem::relative(entry.path(), root).string()] =
                testsupport::readFile(entry.path());
        }
    }
    return files;
}

}  // namespace

TEST(LanBackEnd, ACharacterizationStoresWhatTheInProcessRunStores) {
    const std::string faults = R"("faults": {"wrong_pad_db": {"R2": 10}, "bad_data": {"B": 1}})";
    SimRun local(faults);
    SimRun lan(faults, "T3872A", {"010", "080"}, nullptr, true);
    for (SimRun* sim : {&local, &lan}) {
        sim->ui.answer("Unexpected power ratio reading", {platform::Answer::Yes});
        sim->ui.badData({platform::BadDataChoice::Retest});
        ASSERT_EQ(sim->run({"R1", "R2", "A", "B"}), 0) << ::testing::PrintToString(sim->notices());
    }
    EXPECT_EQ(lan.notices(), local.notices());
    EXPECT_EQ(lan.captions(), local.captions());
    EXPECT_EQ(lan.findings, local.findings);
    const auto expected = filesUnder(local.dir.path());
    const auto actual = filesUnder(lan.dir.path());
    ASSERT_EQ(actual.size(), expected.size());
    for (const auto& [path, bytes] : expected) {
        ASSERT_TRUE(actual.count(path)) << path;
        EXPECT_TRUE(actual.at(path) == bytes) << path << " differs";
    }
}

TEST(LanBackEnd, EachPowerLevelTakesAFewRoundTrips) {
    SimRun lan("", "T3872A", {"010", "080"}, nullptr, true);
    int levels = 0;
    lan.signals.onStep = [&levels](const platform::RunStep&) { ++levels; };
    const auto before = lan.link->counts();
    ASSERT_EQ(lan.run({"R1"}), 0);
    const auto after = lan.link->counts();
    ASSERT_GT(levels, 10);
    const double perLevel = static_cast<double>(after.roundTrips - before.roundTrips) / levels;
    const double messagesPerLevel = static_cast<double>(after.messages - before.messages) / levels;
    RecordProperty("round_trips_per_level", std::to_string(perLevel));
    RecordProperty("messages_per_level", std::to_string(messagesPerLevel));
    std::printf("R1 over the LAN back end: %d levels, %.1f round trips and %.1f messages a level\n",
                levels, perLevel, messagesPerLevel);
    EXPECT_LE(perLevel, 12.0);
}

TEST(LanBackEnd, ALostReplyEndsTheRunWithOneClearErrorAndStoresNothing) {
    SimRun lan("", "T3872A", {"010", "080"}, nullptr, true);
    const auto flashBefore = filesUnder(lan.dir / "analyzer" / "flash");
    int traces = 0;
    lan.transport->beforeReply = [&traces](const std::string& reply) {
        if (!reply.empty() && reply.front() == '#' && ++traces == 7) {
            throw remote::LinkFailure("no reply in 10 s");
        }
    };
    EXPECT_EQ(lan.run({"A"}), 1);
    const auto boxes = lan.ui.boxes();
    ASSERT_FALSE(boxes.empty());
    EXPECT_EQ(boxes.back().box.caption, "Error");
    EXPECT_EQ(boxes.back().box.text,
              "reading the trace of measurement 'measratio' from TCPIP::sim::SOCKET: no reply "
              "in 10 s");
    EXPECT_EQ(lan.notices().back(), "Error in Cal");
    EXPECT_NE(lan.findings["A"], 2);
    EXPECT_EQ(filesUnder(lan.dir / "analyzer" / "flash"), flashBefore);

    // The next exchange goes over a new connection, where the late reply cannot follow.
    lan.transport->beforeReply = nullptr;
    const unsigned connections = lan.transport->connections();
    EXPECT_EQ(lan.analyzer->readmodel(true), "T3872A");
    EXPECT_EQ(lan.transport->connections(), connections + 1);
}
