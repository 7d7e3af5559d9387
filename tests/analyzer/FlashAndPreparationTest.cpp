#include <sstream>

#include "ProxyFixture.h"

using ::testing::ElementsAre;
using ::testing::IsEmpty;

TEST_F(ProxyTest, FlashArrayRendersEveryWordValueAsAStreamDoesAndFollowsUp) {
    auto proxy = connect();
    std::vector<std::uint16_t> image(65536 + 3);
    std::ostringstream command;
    command << "DIAG:FLASHARRAY \"RcvrChar\",\"B\"";
    for (std::size_t i = 0; i < image.size(); ++i) {
        image[i] = static_cast<std::uint16_t>(i);
        command << ", " << image[i];
    }
    fake.parser->reply(command.str(), {"written"});
    EXPECT_EQ(proxy->flasharray("RcvrChar", "B", image), "written");
    EXPECT_THAT(fake.log->scpi(),
                ElementsAre(command.str(), "DIAG:POKE 9,4", "DIAG:POKE 9,3", "DIAG:EEUPDATEHW"));

    fake.log->clear();
    proxy->flasharray("RcvrChar", "R1_LFE", {});
    EXPECT_EQ(fake.log->scpi().front(), "DIAG:FLASHARRAY \"RcvrChar\",\"R1_LFE\"");

    fake.parser->reply("DIAG:FLASH:CAT?", {"01/02/2024,x,y,RCVRCHAR\\A"});
    EXPECT_EQ(proxy->flashcatalog(), "01/02/2024,x,y,RCVRCHAR\\A");
}

TEST_F(ProxyTest, PreparationSequence) {
    auto proxy = connect();
    fake.log->clear();
    proxy->preparecal();
    std::vector<std::string> expected;
    auto then = [&](std::initializer_list<const char*> calls) {
        expected.insert(expected.end(), calls.begin(), calls.end());
    };
    const auto manualPorts = {"channel.setAttenuatorMode(1,1)", "channel.setAttenuatorMode(2,1)",
                              "channel.setAttenuatorMode(3,1)", "channel.setAttenuatorMode(4,1)"};
    then({"app.reset()", "app.preset(1)", "app.activeChannel()", "channel.segmentTable()",
          "scpi *IDN?", "scpi *opt?", "scpi diag:portcount?", "app.currentMeasurement()",
          "app.reset()", "channel.startFrequency()", "channel.stopFrequency()",
          "app.currentMeasurement()", "scpi CALC:PAR:DEL \"CH1_S11_1\"",
          "scpi CALC:PAR:DEF:EXT \"CH1_S11_1\",\"R1,PORT 1\"",
          "scpi DISP:WIND:TRACE:FEED \"CH1_S11_1\"", "scpi SOUR:POW? \"PORT 1\"",
          "channel.numberOfPoints()", "app.currentMeasurement()"});
    then(manualPorts);
    then({"channel.setNumberOfPoints(21)", "channel.setIfBandwidth(1000)",
          "channel.setSweepType(3)", "channel.startFrequency()", "channel.stopFrequency()",
          "channel.setCwFrequency(0)"});
    then(manualPorts);
    then({"app.setTriggerSetting(3)", "channel.setTriggerSetting(1)",
          "channel.setContinuousSweep(true)", "scpi diag:eeupdatehw", "app.setTriggerSetting(3)",
          "channel.setTriggerSetting(1)", "channel.setContinuousSweep(true)",
          "scpi diag:poke:long 9,3", "scpi diag:eeupdatehw"});
    EXPECT_EQ(fake.log->calls, expected);
    EXPECT_EQ(proxy->readnumberofpoints(false), 21);
    EXPECT_EQ(proxy->sweeptype(), "cw");
    EXPECT_EQ(proxy->startfrequency(), 0);
    EXPECT_EQ(proxy->stopfrequency(), 0);
    EXPECT_EQ(proxy->measurementreceiver(), "R1");
    EXPECT_EQ(proxy->measurementport(), "PORT 1");

    // Again: the points are already 21 and the measurement already defined.
    fake.log->clear();
    proxy->preparecal();
    EXPECT_THAT(fake.log->matching("channel.setNumberOfPoints"), IsEmpty());
    EXPECT_THAT(fake.log->matching("scpi CALC:PAR"), IsEmpty());
    const auto scpi = fake.log->scpi();
    ASSERT_GE(scpi.size(), 3u);
    EXPECT_THAT(std::vector<std::string>(scpi.end() - 3, scpi.end()),
                ElementsAre("diag:eeupdatehw", "diag:poke:long 9,3", "diag:eeupdatehw"));
}

TEST_F(ProxyTest, PreparationSetsStartPowerWhenItDiffers) {
    fake.parser->reply("SOUR:POW? \"PORT 1\"", {"-25.5"});
    auto proxy = prepared();
    proxy->setsourcepower(-30, false);  // cached by preparation
    EXPECT_THAT(fake.log->scpi(), IsEmpty());

    fake.log->clear();
    proxy->preparecal();
    EXPECT_THAT(fake.log->matching("scpi SOUR:POW "), ElementsAre("scpi SOUR:POW -30,\"PORT 1\""));
}

TEST_F(ProxyTest, PreparationNeedsChannelAndSegmentInterfaces) {
    const std::string mismatch =
        "The 770x.tlb in use on the box does not match the file used during the build";
    auto proxy = connect();
    fake.application->channel = std::make_shared<automation::Object>();
    EXPECT_EQ(errorOf([&] { proxy->preparecal(); }), mismatch);

    fake.application->channel = std::make_shared<fakeanalyzer::FakeChannel>(
        fake.log, std::make_shared<automation::Object>());
    EXPECT_EQ(errorOf([&] { proxy->preparecal(); }), mismatch);
    EXPECT_THAT(fake.log->scpi(), IsEmpty());
}
