#include <gtest/gtest.h>

#include "SimFixture.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/BenchInstructions.h"
#include "sim/Instrument.h"
#include "sim/ReceiverPhysics.h"
#include "sim/SimulatedBench.h"

namespace {

using simtest::SimFixture;

TEST(BenchInstructions, ReadsEveryKindOfConnectionInstruction) {
    const std::pair<const char*, const char*> cases[] = {
        {"Connect cable to PORT 1.\r\nConnect ** 20 ** pad to cable.\r\nConnect pad to "
         "\"RCVR R1 IN\"",
         "R1@1/20;"},
        {"Connect cable to PORT 2.\r\nConnect one port of Lossy Delay Line 40317-11012 to "
         "cable.\r\nConnect other port of Delay Line directly to \"RCVR R2 IN\"",
         "R2@2/21;"},
        {"Connect cable from PORT 3 to \"RCVR C IN\" (with no pad).", "C@3/0;"},
        {"Remove front panel jumper from port \"RCVR R1 IN\".\r\nConnect 10 dB pad between "
         "\"RCVR R1 IN\" and \"SRC OUT\" connector.\r\nConnect cable to Port 1.\r\n\r\nConnect "
         "6dB pad to cable.\r\nRemove front panel jumper from port \"RCVR A IN\".\r\nConnect "
         "pad to \"RCVR A IN\".\r\n",
         "R1@1/10;A@1/6;"},
        {"Connect cable to Port 4.\r\n\r\nRemove front panel jumper from port \"RCVR D "
         "IN\".\r\nConnect other end of cable to \"RCVR D IN\".\r\n",
         "D@4/0;"},
        {"Please wait.", ""}};
    for (const auto& [instruction, expected] : cases) {
        std::string text;
        for (const auto& c : sim::readConnectionInstructions(instruction)) {
            text += c.receiver + "@" + std::to_string(c.port) + "/" + std::to_string(int(c.padDb)) +
                    ";";
        }
        EXPECT_EQ(expected, text) << instruction;
    }
    EXPECT_EQ("C", sim::receiverOfConnectionComplaint(
                       "Receiver C In does not seem to be connected to source Port 3\nPlease "
                       "check connection\nRetry? (no will continue)")
                       .value());
    for (const auto& [name, receiver] :
         {std::pair{"R3 LOW FREQUENCY EXTENSION", "R3"}, {"R2_LFE", "R2"}, {"B", "B"}}) {
        EXPECT_EQ(receiver, sim::instrumentReceiver(name));
    }
}

// The connection check, the power-ratio check and a memory division, as the engine runs them.
class Bench : public SimFixture {
  protected:
    void startBench(const std::string& scenario) {
        start(scenario);
        m_bench = std::make_unique<sim::SimulatedBench>(m_operator, *m_analyzer);
        m_operator.answerAll(platform::Answer::Ok);
    }
    void instruct(const std::string& text) {
        m_bench->messageBox({text, "Connections", platform::Buttons::Ok, platform::BoxNone});
    }
    // measmag of the receiver and measratio, CW at the source power of the port.
    void define(const std::string& receiver, const std::string& ratio, int port) {
        scpi("CALC:PAR:DEL:ALL");
        scpi("CALC:PAR:DEF:EXT \"measmag\",\"" + receiver + "," + std::to_string(port) + "\"");
        scpi("CALC:PAR:DEF:EXT \"measratio\",\"" + ratio + "," + std::to_string(port) + "\"");
        channel()->setSweepType(3);
        m_port = port;
    }
    float reading(const std::string& name, double sourceDbm) {
        scpi("SOUR:POW " + std::to_string(sourceDbm) + ",\"PORT " + std::to_string(m_port) + "\"");
        channel()->setContinuousSweep(true);
        return read(name)[0];
    }
    bool connectionCheckPasses() {
        return reading("measmag", -5.0) - reading("measmag", -10.0) >= 2.0;
    }

    platform::ScriptedOperatorUi m_operator;
    std::unique_ptr<sim::SimulatedBench> m_bench;
    int m_port = 1;
};

TEST_F(Bench, ForwardsEveryBoxAndAnswer) {
    startBench("{}");
    m_operator.answer("Check Connection", {platform::Answer::No});
    EXPECT_EQ(platform::Answer::No,
              m_bench->messageBox({"x", "Check Connection", platform::Buttons::YesNo, 0}));
    m_operator.badData({platform::BadDataChoice::Quit});
    EXPECT_EQ(platform::BadDataChoice::Quit, m_bench->badDataChoice("A"));
    EXPECT_EQ((std::vector<std::string>{"Check Connection"}), m_operator.captions());
    EXPECT_EQ((std::vector<std::string>{"A"}), m_operator.badDataReceivers());
}

TEST_F(Bench, HealthyCablingPassesEveryCheck) {
    startBench("{}");
    instruct(
        "Connect cable to PORT 1.\r\nConnect ** 20 ** pad to cable.\r\nConnect pad to "
        "\"RCVR R1 IN\"");
    EXPECT_DOUBLE_EQ(20.0, m_analyzer->instrument().connectionOf("R1").lossDb);
    define("R1", "R1/A", 1);
    EXPECT_TRUE(connectionCheckPasses());
    EXPECT_NEAR(20.0, reading("measratio", -25.0), 0.05);
    // Moving the cable on gives R1 its jumper back.
    instruct("Connect cable from PORT 1 to \"RCVR A IN\" (with no pad).");
    EXPECT_DOUBLE_EQ(0.0, m_analyzer->instrument().connectionOf("R1").lossDb);
    EXPECT_EQ(1, m_analyzer->instrument().connectionOf("A").port);
}

// A "No" to the recheck question leaves the connector as it was; each "Yes" reseats it once.
TEST_F(Bench, DisconnectedReceiverFailsUntilReseatedThatManyTimes) {
    startBench(R"({"faults": {"disconnected": {"C": 2}}})");
    m_operator.answer("Check Connection",
                      {platform::Answer::No, platform::Answer::Yes, platform::Answer::Yes});
    instruct("Connect cable from PORT 3 to \"RCVR C IN\" (with no pad).");
    define("C", "C/R3", 3);
    int failures = 0;
    while (!connectionCheckPasses() && failures < 5) {
        ++failures;
        m_bench->messageBox(
            {"Receiver C In does not seem to be connected to source Port 3\n"
             "Please check connection\nRetry? (no will continue)",
             "Check Connection", platform::Buttons::YesNo, 0});
    }
    EXPECT_EQ(3, failures);
}

TEST_F(Bench, WrongPadShowsInThePowerRatioUntilTheOperatorRechecks) {
    startBench(R"({"faults": {"wrong_pad_db": {"R2": 10}}})");
    m_operator.answer("Unexpected power ratio reading", {platform::Answer::Yes});
    std::string instruction =
        "Connect cable to PORT 2.\r\nConnect ** 20 ** pad to cable.\r\nConnect pad to \"RCVR R2 "
        "IN\"";
    instruct(instruction);
    define("R2", "R2/B", 2);
    EXPECT_NEAR(10.0, reading("measratio", -25.0), 0.2);  // 10 dB less pad: some compression
    m_bench->messageBox(
        {"Expected power ratio: 20 +/- 5 dB\nPower ratio read: 10\nCheck "
         "connections, connection instructions were: \n\n" +
             instruction + "\n\nRetry? (no will continue)",
         "Unexpected power ratio reading", platform::Buttons::YesNo, 0});
    EXPECT_NEAR(20.0, reading("measratio", -25.0), 0.05);
    // Fixed for good: the next instruction for R2 gets the right pad at once.
    instruct(instruction);
    EXPECT_NEAR(20.0, reading("measratio", -25.0), 0.05);
}

TEST_F(Bench, NarrowbandLossAndAttenuatorReplyFaults) {
    startBench(R"({"faults": {"narrowband_loss_db": {"D": -15},
                              "attenuator_reply": {"A": "", "B": "\"20\""}}})");
    define("D", "D/R4", 4);
    float wide = reading("measmag", -10.0);
    scpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"NBF\"");
    EXPECT_NEAR(-15.0, reading("measmag", -10.0) - wide, 1e-4);
    EXPECT_EQ("", scpi("SENS:PATH:CONF:ELEM? \"NBFATNA\""));
    EXPECT_EQ("\"20\"", scpi("SENS:PATH:CONF:ELEM? \"NBFATNB\""));
    EXPECT_EQ("\"30\"", scpi("SENS:PATH:CONF:ELEM? \"NBFATNC\""));
}

TEST_F(Bench, LooseConnectorReadsFlatUntilTheBadDataDialogWasShown) {
    startBench(R"({"faults": {"bad_data": {"B": 1}}})");
    m_operator.badData({platform::BadDataChoice::Retest});
    define("B", "B/R2", 2);
    auto measureLadder = [&] {
        reading("measratio", -25.0);
        scpi("CALC:PAR:SEL \"measratio\"");
        scpi("CALC:math:mem");
        scpi("CALC:math:func div");
        std::vector<float> ladder;
        for (double p = -20.0; p <= 0.0; p += 5.0) {
            ladder.push_back(reading("measratio", p));
        }
        return ladder;
    };
    for (float v : measureLadder()) {
        EXPECT_FLOAT_EQ(static_cast<float>(sim::Instrument::looseConnectorDb), v);
    }
    EXPECT_EQ(platform::BadDataChoice::Retest, m_bench->badDataChoice("B"));
    define("B", "B/R2", 2);
    auto good = measureLadder();
    const auto& b = m_analyzer->scenario().receiver("B");
    const double cw = channel()->startFrequency();
    EXPECT_NEAR(sim::compressionDb(b, 0.0, cw) - sim::compressionDb(b, -25.0, cw), good.back(),
                1e-4);
    EXPECT_LT(good.back(), good.front());
}

}  // namespace
