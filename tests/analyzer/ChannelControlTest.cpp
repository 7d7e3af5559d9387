#include "ProxyFixture.h"

using ::testing::ElementsAre;
using ::testing::IsEmpty;

TEST_F(ProxyTest, SweepTypeIsSetOnceAndReadBack) {
    auto proxy = prepared();  // leaves the channel in CW
    proxy->setsweeptype("cw");
    EXPECT_THAT(fake.log->calls, IsEmpty());

    fake.channel->start = 1e6;
    fake.channel->stop = 9e9;
    proxy->setsweeptype("linear");
    proxy->setsweeptype("linear");
    EXPECT_THAT(fake.log->calls, ElementsAre("channel.setSweepType(0)", "channel.startFrequency()",
                                             "channel.stopFrequency()"));
    EXPECT_EQ(proxy->startfrequency(), 1e6);
    EXPECT_EQ(proxy->stopfrequency(), 9e9);

    fake.log->clear();
    proxy->setsweeptype("powersweep");
    EXPECT_THAT(fake.log->calls, ElementsAre("channel.setSweepType(2)", "channel.startFrequency()",
                                             "channel.stopFrequency()", "channel.startPower()",
                                             "channel.stopPower()"));
    EXPECT_EQ(proxy->readsourcepower(false), -20);
    EXPECT_EQ(proxy->stoppower(), 0);

    fake.log->clear();
    proxy->setsweeptype("segmentsweep");
    EXPECT_THAT(fake.log->calls, ElementsAre("channel.setSweepType(4)"));

    EXPECT_EQ(errorOf([&] { proxy->setsweeptype("Segmentsweep"); }),
              "Unrecognized Sweep Type in CNetworkAnalyzer");
    EXPECT_EQ(proxy->sweeptype(), "segmentsweep");
}

TEST_F(ProxyTest, SourcePowerSkipsOnlyWhatIsAlreadySet) {
    auto proxy = prepared();  // source power read back as -30
    proxy->setsourcepower(-30, false);
    EXPECT_THAT(fake.log->calls, IsEmpty());
    proxy->setsourcepower(-30, true);
    proxy->setsourcepower(-12.3456789, false);
    proxy->setsourcepower(-30, false);
    proxy->setsourcepower(1234567, false);
    EXPECT_THAT(fake.log->scpi(),
                ElementsAre("SOUR:POW -30,\"PORT 1\"", "SOUR:POW -12.3457,\"PORT 1\"",
                            "SOUR:POW -30,\"PORT 1\"", "SOUR:POW 1.23457e+06,\"PORT 1\""));

    // In a power sweep the power becomes both ends of the sweep at the cached frequency.
    proxy->setpowersweep(-40, -10, 2e9);
    fake.log->clear();
    proxy->setsourcepower(-5, false);
    EXPECT_THAT(fake.log->calls,
                ElementsAre("channel.setStartPower(-5)", "channel.setStopPower(-5)",
                            "channel.setCwFrequency(2000000000)"));
    EXPECT_EQ(proxy->readsourcepower(false), -5);
    EXPECT_EQ(proxy->stoppower(), -5);
}

TEST_F(ProxyTest, AttenuatorPortsAndModes) {
    auto proxy = prepared();  // four ports
    ui.answerAll(platform::Answer::Ok);
    proxy->setattenuator("manual", 0);
    proxy->setattenuator("auto", 5);
    proxy->setattenuator("Auto", 2);
    proxy->setattenuator("MANUAL", 4);
    proxy->setattenuator("fixed", 1);
    EXPECT_THAT(fake.log->calls,
                ElementsAre("channel.setAttenuatorMode(2,0)", "channel.setAttenuatorMode(4,1)"));
    ASSERT_EQ(ui.boxes().size(), 3u);
    EXPECT_EQ(ui.boxes()[0].box.text, "I do not recognize port 0");
    EXPECT_EQ(ui.boxes()[1].box.text, "I do not recognize port 5");
    EXPECT_EQ(ui.boxes()[2].box.text, "Unknown attenuator setting");
    EXPECT_EQ(ui.boxes()[2].box.caption, "");
}

TEST_F(ProxyTest, PathElementsAreSentAllButTheLast) {
    auto proxy = connect();
    proxy->setpathelement("A,1/B,two/Config");
    EXPECT_THAT(fake.log->scpi(), ElementsAre("sense:path:conf:elem \"A\",\"1\"",
                                              "sense:path:conf:elem \"B\",\"two\""));
    EXPECT_EQ(proxy->pathdescription(), "Config Not Measured");
    proxy->setpathelement("Config");
    EXPECT_EQ(proxy->pathdescription(), "Config Not Measured");
    proxy->setpathelement("Port 2 Dialog");
    EXPECT_EQ(proxy->pathdescription(), "Port 2 ");
    EXPECT_EQ(fake.log->scpi().size(), 2u);

    EXPECT_EQ(errorOf([&] { proxy->setpathelement("A,1/Bogus/Config"); }),
              "CNetworkAnalyzer::setpathelement: the item \"Bogus\" of \"A,1/Bogus/Config\" is "
              "not an element name, a comma and a value");
}

TEST_F(ProxyTest, SegmentTableSwitchesBandwidthAndPower) {
    auto proxy = prepared();
    const std::vector<double> starts{1e6, 1e8, 1e9, 1e10};
    const std::vector<double> stops{1e8, 1e9, 1e10, 2e10};
    const std::vector<double> points{11, 21.9, 31, 41};
    const std::vector<double> sameBandwidth{10, 1000, 1000, 1000};
    const std::vector<double> samePower{-50, -20, -20, -20};

    // Equal values in segments 1..3: one channel bandwidth and one forced source power, taken
    // from the first segment of the range.
    proxy->setsegments(starts, stops, points, sameBandwidth, samePower, 1, 0);
    EXPECT_THAT(fake.log->calls,
                ElementsAre("channel.setSweepType(4)", "channel.setIfBandwidth(1000)",
                            "scpi SOUR:POW -20,\"PORT 1\"", "segments.writeTable(3)"));
    ASSERT_EQ(fake.segmentTable->rows.size(), 3u);
    const auto& r = fake.segmentTable->rows[0];
    EXPECT_THAT((std::vector{r.on, r.points, r.start, r.stop, r.ifBandwidth, r.reserved, r.power}),
                ElementsAre(1, 21.9, 1e8, 1e9, 1000, 0, -20));
    EXPECT_EQ(fake.segmentTable->rows[2].start, 1e10);
    EXPECT_EQ(proxy->readnumberofpoints(false), 21 + 31 + 41);

    // Differing values switch the per-segment settings; the point count is not accumulated.
    fake.log->clear();
    proxy->setsegments(starts, stops, points, sameBandwidth, samePower, 0, 1);
    EXPECT_THAT(fake.log->calls,
                ElementsAre("segments.setPerSegmentBandwidth(1)",
                            "segments.enablePerSegmentPower()", "segments.writeTable(2)"));
    EXPECT_EQ(proxy->readnumberofpoints(false), 11 + 21);

    EXPECT_EQ(errorOf([&] {
                  proxy->setsegments(starts, stops, {1, 2}, sameBandwidth, samePower, 1, 3);
              }),
              "CNetworkAnalyzer::setsegments: segments 1 to 3 do not fit the segment lists "
              "(shortest list has 2 entries)");
    EXPECT_EQ(errorOf([&] { proxy->setsegments({}, {}, {}, {}, {}, 0, 0); }),
              "CNetworkAnalyzer::setsegments: segments 0 to -1 do not fit the segment lists "
              "(shortest list has 0 entries)");
}

TEST_F(ProxyTest, MeasurementDefinitionIsSentOnlyWhenItChanges) {
    auto proxy = prepared();  // R1 on PORT 1
    proxy->definemeasurement("R1", "port 1", "", "None Set", false);
    EXPECT_THAT(fake.log->scpi(), IsEmpty());

    proxy->definemeasurement("a", "Port 2", "ignored", "ifsigpath,nbf/Port 2 Dialog", false);
    EXPECT_THAT(fake.log->scpi(), ElementsAre("CALC:PAR:DEL \"CH1_S11_1\"",
                                              "CALC:PAR:DEF:EXT \"CH1_S11_1\",\"A,PORT 2\"",
                                              "DISP:WIND:TRACE:FEED \"CH1_S11_1\"",
                                              "sense:path:conf:elem \"IFSIGPATH\",\"NBF\""));
    EXPECT_EQ(proxy->measurementreceiver(), "A");
    EXPECT_EQ(proxy->measurementport(), "PORT 2");

    fake.log->clear();
    proxy->definemeasurement("A", "PORT 2", "", "None Set", true);
    EXPECT_EQ(fake.log->scpi().size(), 3u);

    // The analyzer's own view of the current measurement replaces the cached receiver.
    EXPECT_EQ(proxy->readmeasurementname(true), "R1");
    EXPECT_EQ(proxy->measurementreceiver(), "R1");
}

TEST_F(ProxyTest, TriggerSweepAndOneTimeSettings) {
    auto proxy = prepared();
    proxy->sweep(true);
    proxy->sweep(false);
    proxy->primemeasurement();
    proxy->primemeasurement();
    proxy->setchannelswitch(false);
    EXPECT_THAT(
        fake.log->calls,
        ElementsAre("app.setTriggerSetting(3)", "channel.setTriggerSetting(1)",
                    "channel.singleSweep()", "app.wait(1,5000)", "app.setTriggerSetting(3)",
                    "channel.setTriggerSetting(1)", "channel.setContinuousSweep(true)",
                    "app.currentMeasurement()", "measurement.setFirstSetting(1)",
                    "measurement.setSecondSetting(-1)", "channel.setIfBandwidthSwitch(false)"));
}
