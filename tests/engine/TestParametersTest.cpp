#include <gtest/gtest.h>

#include "ErrorOf.h"
#include "TestConfiguration.h"
#include "engine/CompressionData.h"
#include "engine/TestParameters.h"
#include "platform/ScriptedOperatorUi.h"

using namespace engine;
using enginetest::TestConfiguration;

TEST(PowerLadder, AccumulatesStepsAndStopsBelowTheEnd) {
    auto ladder = powerLadder(-30, 0, 2);
    ASSERT_EQ(ladder.size(), 16u);
    EXPECT_EQ(ladder.back(), 0.0);
    EXPECT_EQ(powerLadder(-30, 0, 7), (std::vector<double>{-30, -23, -16, -9, -2}));
    // Accumulated addition, not start + i * step.
    auto fine = powerLadder(0, 1, 0.1);
    ASSERT_EQ(fine.size(), 11u);
    EXPECT_EQ(fine.back(), 0.1 + 0.1 + 0.1 + 0.1 + 0.1 + 0.1 + 0.1 + 0.1 + 0.1 + 0.1);
    EXPECT_TRUE(powerLadder(0, -30, 2).empty());
    EXPECT_TRUE(powerLadder(-30, 0, 0).empty());
}

TEST(RunConstants, BuildTheThreeLaddersAndChooseByReceiver) {
    TestConfiguration config;
    config.SetConstant("LFEteststoppower", -9.1);
    auto constants = readRunConstants(config);
    EXPECT_EQ(constants.testLadder.size(), 16u);
    // Truncated toward zero: -9.1 gives -9, so the LFE ladder ends at -10.
    EXPECT_EQ(constants.lfeLadder.back(), -10);
    EXPECT_EQ(constants.referenceLadder, (std::vector<double>{-20, -15, -10, -5, 0}));

    auto lfe = chooseReceiverSetup(constants, "R1 LOW FREQUENCY EXTENSION", "Direct-Search");
    EXPECT_TRUE(lfe.lfe && lfe.reference && lfe.portMode);
    EXPECT_EQ(lfe.searchMode, "Port-Search");
    EXPECT_EQ(lfe.ladder, &constants.lfeLadder);
    auto refDirect = chooseReceiverSetup(constants, "R2", "Direct-Search");
    EXPECT_EQ(refDirect.ladder, &constants.referenceLadder);
    EXPECT_EQ(refDirect.firstBand, 1);
    auto testPort = chooseReceiverSetup(constants, "A", "Port-Search");
    EXPECT_EQ(testPort.ladder, &constants.testLadder);
    EXPECT_FALSE(testPort.reference);

    EXPECT_EQ(referencePower(config, refDirect), -25);
    EXPECT_EQ(referencePower(config, testPort), -25);
    EXPECT_EQ(referencePower(config, chooseReceiverSetup(constants, "A", "Direct-Search")), -30);
    EXPECT_EQ(receiverLabel("R3 LOW FREQUENCY EXTENSION"), "R3");
}

TEST(BandPlan, ListsPointsLowFrequenciesAndPerBandValues) {
    TestConfiguration config;
    config.SetOptions({"2100", "21", "010"});
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.loadTestParameters(config, 1);
    EXPECT_EQ(store.getLowFrequencies(), (std::vector<double>{10e6, 20e6, 30e6, 40e6, 50e6}));
    EXPECT_EQ(store.getFrequencies(),
              (std::vector<double>{100e6, 400e6, 700e6, 1e9, 2e9, 4e9, 6e9}));
    EXPECT_EQ(store.getBandPoints(), (std::vector<double>{4, 3}));
    EXPECT_EQ(store.getBandIfbws(), (std::vector<double>{1000, 1000}));
    EXPECT_EQ(store.getBandRefPowers(), (std::vector<double>{-30, -30}));
    EXPECT_EQ(store.getBandPowerLimits(), (std::vector<double>{30, -10}));
    EXPECT_EQ(store.getMaxBand(), 2);
    EXPECT_FALSE(store.hasOption210());
    EXPECT_FALSE(store.isT3951());

    config.SetOptions({"010", "210"});
    // Leading bands without points do not start the low list; a one-point band is its start.
    config.setBand(0, 1e6, 2e6, 0, 30);
    config.setBand(1, 5e6, 5e6, 1, 30);
    config.SetConstant("maxband", 2);
    store.loadTestParameters(config, 2);
    EXPECT_TRUE(store.hasOption210());
    EXPECT_EQ(store.getLowFrequencies(), (std::vector<double>{5e6}));
    EXPECT_EQ(store.getBandStarts(), (std::vector<double>{2e9}));

    // A band without points still has its per-band entries.
    config.setBand(2, 2e9, 6e9, 0, 30);
    store.loadTestParameters(config, 2);
    EXPECT_EQ(store.getBandStarts().size(), 1u);
    EXPECT_TRUE(store.getFrequencies().empty());
}

TEST(BandPlan, LfeBandsUseCutOffBandwidthsAndT3951StopsAtTheMaximum) {
    TestConfiguration config;
    config.SetLFEMode(true);
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.loadTestParameters(config, 0);
    EXPECT_TRUE(store.isLfe());
    EXPECT_EQ(store.getBandIfbws(), (std::vector<double>{100, 300}));
    EXPECT_EQ(store.getFrequencies().size(), 8u);

    config.SetLFEMode(false);
    config.SetModel("T3951A");
    config.setBand(3, 20e9, 30e9, 3, 30);
    config.SetConstant("maxband", 3);
    store.loadTestParameters(config, 1);
    EXPECT_TRUE(store.isT3951());
    EXPECT_EQ(store.getMaxBand(), 2);
    EXPECT_EQ(store.getBandStarts().size(), 2u);

    config.SetConstant("maxband", 4);
    config.SetModel("T3872A");
    EXPECT_EQ(testsupport::errorOf([&] { store.loadTestParameters(config, 1); }),
              "CNAData::GetBandDefaults - Unknown Band (4)");
}
