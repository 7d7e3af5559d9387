#include <gtest/gtest.h>

#include "SimRun.h"

using enginetest::SimRun;
using Notices = std::vector<std::string>;

TEST(CharacterizationRun, OneTestReceiverPostsTheNoticesInOrder) {
    SimRun sim;
    ASSERT_EQ(sim.run({"A"}), 0) << ::testing::PrintToString(sim.captions());
    EXPECT_EQ(sim.notices(),
              (Notices{"Cal Started", "NOTE: IF overload and unleveled messages are expected.",
                       "Started Cal A", "Almost Done with Cal", "Writing Cal File", ".",
                       "Cal Complete"}));
    EXPECT_EQ(sim.findings["A"], 2);
    EXPECT_FALSE(sim.signals.workerRunning);
}

namespace {

// Replaces the first line that starts with start in the sample configuration (the T3872A
// block comes first); an empty replacement removes the line.
void replaceLine(std::string& text, const std::string& start, const std::string& line) {
    const auto at = text.find("\n" + start);
    ASSERT_NE(at, std::string::npos) << start;
    const auto end = text.find('\n', at + 1);
    text.replace(at, end - at, line.empty() ? "" : "\n" + line);
}

// The model's "Order / Power" block sets the test ladder's ends.
std::function<void(std::string&)> testPower(const std::string& range) {
    return [=](std::string& text) {
        replaceLine(text, ",Test Power,", ",Test Power,\"" + range + "\"");
    };
}

int count(const std::vector<std::string>& list, const std::string& item) {
    return static_cast<int>(std::count(list.begin(), list.end(), item));
}

}  // namespace

TEST(CharacterizationRun, AlmostDoneNeedsMoreThanFiveLevels) {
    SimRun five("", "T3872A", {"010", "080"}, testPower("-30,-22"));
    ASSERT_EQ(five.run({"A"}), 0);
    EXPECT_EQ(count(five.notices(), "Almost Done with Cal"), 0);

    SimRun six("", "T3872A", {"010", "080"}, testPower("-30,-20"));
    six.noticeSink.trigger = "Almost Done";
    six.noticeSink.onTrigger = [&six] {
        // Right after the first level: one level's traces are filed.
        EXPECT_EQ(count(six.commands(), "SENS:AVER:STAT OFF"), 1);
    };
    ASSERT_EQ(six.run({"A"}), 0);
    EXPECT_EQ(count(six.notices(), "Almost Done with Cal"), 1);
}

TEST(CharacterizationRun, ReferenceReceiverIsMeasuredInTwoSegmentsWithTheirOwnCabling) {
    SimRun sim;
    std::vector<std::tuple<std::string, int, int, int, int>> steps;
    sim.signals.onStep = [&steps](const platform::RunStep& step) {
        steps.emplace_back(step.receiver, step.segment, step.segments, step.level, step.levels);
    };
    ASSERT_EQ(sim.run({"R1"}), 0);
    // Every level of both segments is announced before it is measured, in order.
    const int levels = static_cast<int>(steps.size()) / 2;
    ASSERT_GT(levels, 5);
    for (int i = 0; i < 2 * levels; ++i) {
        EXPECT_EQ(steps[static_cast<std::size_t>(i)],
                  std::make_tuple("R1", 1 + i / levels, 2, 1 + i % levels, levels))
            << i;
    }
    // Bands 2..6 with the break at band 5: bands 2-4 with the pad, 5-6 with the delay line.
    const auto boxes = sim.ui.boxes();
    std::vector<std::string> connections;
    for (const auto& record : boxes) {
        if (record.box.caption == "Connections") {
            connections.push_back(record.box.text);
        }
    }
    ASSERT_EQ(connections.size(), 2u);
    EXPECT_EQ(connections[0],
              "Connect cable to PORT 1.\r\nConnect ** 20 ** pad to cable.\r\nConnect pad to "
              "\"RCVR R1 IN\"");
    EXPECT_EQ(connections[1],
              "Connect cable to PORT 1.\r\nConnect one port of Lossy Delay Line 40317-11012 to "
              "cable.\r\nConnect other port of Delay Line directly to \"RCVR R1 IN\"");
    EXPECT_EQ(count(sim.notices(), "Almost Done with Cal"), 1);
    EXPECT_EQ(count(sim.commands(), "CALC:PAR:DEL:ALL"), 4);
    // Both segments' points end up in one row per level.
    const auto csv = testsupport::readFile(sim.workDir() / "RcvrChar_AllMeasuredData_R1.csv");
    EXPECT_EQ(std::count(csv.begin(), csv.end(), '\n'), 1 + 21 * 4 + 30);

    // The same receiver again: the delay line is not the 20 dB pad, so the box comes back,
    // and then once more for its second segment.
    ASSERT_EQ(sim.run({"R1"}), 0);
    EXPECT_EQ(count(sim.captions(), "Connections"), 4);
    // A test receiver on port 1 after that: new destination and pad.
    ASSERT_EQ(sim.run({"A", "A"}), 0);
    EXPECT_EQ(count(sim.captions(), "Connections"), 5);
}

TEST(CharacterizationRun, RejectedResultsRepeatTheReceiver) {
    SimRun sim(R"("faults": {"bad_data": {"A": 2}})");
    sim.ui.badData({platform::BadDataChoice::Retest});
    ASSERT_EQ(sim.run({"A"}), 0);
    auto notices = sim.notices();
    EXPECT_EQ(count(notices, "Cal will be repeated"), 2);
    EXPECT_EQ(count(notices, "Started Cal A"), 3);
    EXPECT_EQ(notices.back(), "Cal Complete");
    EXPECT_EQ(sim.findings["A"], 2);
}

TEST(CharacterizationRun, AbortDuringTheSecondLevelStopsBeforeTheThird) {
    SimRun sim;
    struct AbortingClock : platform::Clock {
        SimRun* sim = nullptr;
        platform::VirtualClock inner;
        void wait(std::chrono::milliseconds duration) override {
            inner.wait(duration);
            if (count(sim->commands(), "SENS:AVER:STAT OFF") == 2) {
                sim->signals.abortRequested = true;
            }
        }
        std::chrono::milliseconds totalWaited() const override { return inner.totalWaited(); }
    };
    // The proxy's waits drive the clock; swap in one that presses Abort mid-level.
    AbortingClock clock;
    clock.sim = &sim;
    sim.analyzer = std::make_unique<CNetworkAnalyzer>("", *sim.bench, clock);
    sim.analyzer->readmodel(true);
    sim.analyzer->preparecal();
    EXPECT_EQ(sim.run({"A", "B"}), 1);
    auto notices = sim.notices();
    EXPECT_EQ(notices.back(), "Characterization Aborted");
    EXPECT_EQ(count(notices, "Writing Cal File"), 0);
    EXPECT_EQ(count(sim.commands(), "SENS:AVER:STAT OFF"), 2);
    EXPECT_FALSE(sim.signals.workerRunning);
    EXPECT_EQ(sim.findings.count("A"), 0u);
}

TEST(CharacterizationRun, ErrorsEndTheRunWithAnErrorBox) {
    SimRun noMinband("", "T3872A", {"010", "080"}, [](std::string& text) {
        replaceLine(text, "minband,", "");
        replaceLine(text, ",Minband,", "");
    });
    EXPECT_EQ(noMinband.run({"A"}), 1);
    auto boxes = noMinband.ui.boxes();
    ASSERT_FALSE(boxes.empty());
    EXPECT_EQ(boxes.back().box.caption, "Error");
    EXPECT_EQ(boxes.back().box.text, "CNAData::GetConstant - Unknown Name (MINBAND)");
    EXPECT_EQ(noMinband.notices().back(), "Error in Cal");
    EXPECT_EQ(count(noMinband.notices(), "Started Cal A"), 0);

    SimRun emptyLadder("", "T3872A", {"010", "080"}, testPower("-30,-40"));
    EXPECT_EQ(emptyLadder.run({"A"}), 1);
    EXPECT_EQ(emptyLadder.ui.boxes().back().box.text,
              "The power ladder teststartpower -30, teststoppower -40, testpowerstep 2 has no "
              "levels");
    EXPECT_TRUE(emptyLadder.commands().empty());
}

TEST(CharacterizationRun, NarrowbandFaultsAskTheOperator) {
    SimRun sim(R"("faults": {"narrowband_loss_db": {"D": -15}, "attenuator_reply": {"A": ""}})");
    ASSERT_EQ(sim.run({"A"}), 0);
    EXPECT_EQ(count(sim.captions(), "Narrow band attenuator issue"), 1);
    EXPECT_EQ(sim.ui.boxes()[1].box.text,
              "Could not determine narrow band attenuator setting for receiver A\n\nContinue "
              "using default 30 dB setting? (Cancel will abort)");

    sim.ui.answer("Narrow band IF filter path issue", {platform::Answer::Cancel});
    EXPECT_EQ(sim.run({"D"}), 1);
    const auto boxes = sim.ui.boxes();
    ASSERT_GE(boxes.size(), 2u);
    const auto& nb = boxes[boxes.size() - 2].box;
    EXPECT_EQ(nb.caption, "Narrow band IF filter path issue");
    EXPECT_EQ(nb.text.substr(0, 62),
              "Receiver D appears to have an issue with narrow band path \nThe");
    EXPECT_EQ(boxes.back().box.text, nb.text);
    EXPECT_EQ(sim.notices().back(), "Error in Cal");
}

TEST(CharacterizationRun, DirectModeInstructionsAndExternalReference) {
    SimRun sim(R"("idn": "Velquor Technologies,T3871B,MY00000003,A.13.55.06",
                  "options": "010", "port_count": 2)",
               "T3871B", {"010"});
    ASSERT_EQ(sim.run({"A"}, "Direct-Search"), 0) << ::testing::PrintToString(sim.notices());
    const auto boxes = sim.ui.boxes();
    ASSERT_FALSE(boxes.empty());
    // Port 1 with ExternalR1 set: no reference-receiver pad lines.
    EXPECT_EQ(boxes[0].box.caption, "Connections");
    EXPECT_EQ(boxes[0].box.text,
              "Connect cable to Port 1.\r\n\r\nRemove front panel jumper from port \"RCVR A "
              "IN\".\r\nConnect other end of cable to \"RCVR A IN\".\r\n");
    auto sent = sim.commands();
    EXPECT_EQ(count(sent, "SENSe:PATH:CONF:ELEMent:STATe \"Port1RefMxr\",\"External\""), 1);
    EXPECT_EQ(count(sent, "DIAG:RXCAL:STATE ON"), 0);
    EXPECT_GE(sim.clock.totalWaited(), std::chrono::milliseconds(10000));
}
