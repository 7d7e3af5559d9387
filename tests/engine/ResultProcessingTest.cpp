#include <gtest/gtest.h>

#include <sstream>

#include "ErrorOf.h"
#include "TempDir.h"
#include "engine/CompressionData.h"
#include "platform/ScriptedOperatorUi.h"
#include "storage/ResultProcessing.h"

using engine::CCompressionData;
using storage::judgeResults;

namespace {

struct Reading {
    float test;
    float ratio;
    float phase = 0;
};

// A linear receiver at -30..0 dBm whose ratio reads the given compression at each level.
std::vector<Reading> compressing(std::vector<float> compression) {
    std::vector<Reading> readings;
    for (std::size_t i = 0; i < compression.size(); ++i) {
        const float power = -30.0f + 5.0f * static_cast<float>(i);
        readings.push_back({power + compression[i], compression[i], compression[i] * 3});
    }
    return readings;
}

const std::vector<float> kHealthy = {0, -0.02f, -0.05f, -0.1f, -0.2f, -0.5f, -1.0f};

struct Measured {
    platform::ScriptedOperatorUi ui;
    CCompressionData store{ui};
    testsupport::TempDir dir;

    // One column of readings per frequency, all with the same number of levels.
    Measured(std::vector<double> frequencies, const std::vector<std::vector<Reading>>& columns,
             CCompressionData::Limits limits = {10.0, 1.0, 0.5f, 50e9, false, false},
             std::vector<double> low = {}) {
        ui.answerAll(platform::Answer::Ok);
        store.setLimits(limits);
        store.setFrequencies(std::move(frequencies), std::move(low));
        store.setNarrowbandLoss(-3.25f);
        store.setNarrowbandAtten("30");
        const std::size_t levels = columns.front().size();
        store.setPowerLevels(std::vector<double>(levels, 0.0));
        for (std::size_t level = 0; level < levels; ++level) {
            std::vector<float> test, ratio, phase;
            for (const auto& column : columns) {
                test.push_back(column[level].test);
                ratio.push_back(column[level].ratio);
                phase.push_back(column[level].phase);
            }
            const int k = static_cast<int>(level);
            store.putTrace("TestMag", test, k);
            store.putTrace("RatioMag", ratio, k);
            store.putTrace("Phase", phase, k);
        }
    }

    storage::Judgement judge(const std::string& name = "A", bool mmwave = false) {
        return judgeResults(store, name, mmwave, dir / "raw.txt", ui);
    }
    std::string raw() const { return testsupport::readFile(dir / "raw.txt"); }
};

int count(const std::string& text, const std::string& what) {
    int n = 0;
    for (auto at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
        ++n;
    }
    return n;
}

}  // namespace

TEST(JudgeResults, HealthyDataGivesFourLevelsAndAWholeImage) {
    Measured data({1e9, 2e9}, {compressing(kHealthy), compressing(kHealthy)},
                  {10.0, 1.0, 0.5f, 50e9, false, false}, {1e6, 5e6});
    auto result = data.judge("R1_LFE");
    EXPECT_TRUE(result.passed);
    EXPECT_TRUE(result.accepted);
    EXPECT_TRUE(data.ui.badDataReceivers().empty());
    EXPECT_EQ(result.image.bytes().size(), 22u + 56u * 4u);
    EXPECT_EQ(result.image.announcedRecords(), 4u);
    EXPECT_EQ(result.image.nameCharacters(), "R1");
    EXPECT_FLOAT_EQ(result.image.narrowbandLoss(), -3.25f);
    EXPECT_FLOAT_EQ(result.image.attenuatorDb(), 30);
    // Low frequencies first, with zeros.
    EXPECT_EQ(result.image.frequency(0), 1e6);
    EXPECT_EQ(result.image.point(1, 3), storage::CompressionPoint{});
    const float expected[4] = {-0.05f, -0.1f, -0.2f, -0.5f};
    for (std::size_t k = 0; k < 4; ++k) {
        auto point = result.image.point(2, k);
        EXPECT_FLOAT_EQ(point.value, expected[k]);
        EXPECT_FLOAT_EQ(point.power, -20.0f + 5.0f * static_cast<float>(k) + expected[k]);
        EXPECT_FLOAT_EQ(point.phase, expected[k] * 3);
    }
    EXPECT_EQ(data.raw(),
              "1\nR1_LFE\n25\n-3.25\n30"
              "\n1000000000, (-20.049999,-0.050000001,-0.15000001), (-15.1,-0.1,-0.30000001), "
              "(-10.2,-0.2,-0.60000002), (-5.5,-0.5,-1.5)"
              "\n2000000000, (-20.049999,-0.050000001,-0.15000001), (-15.1,-0.1,-0.30000001), "
              "(-10.2,-0.2,-0.60000002), (-5.5,-0.5,-1.5)");
}

TEST(JudgeResults, UnreachedLevelsAreCopiedOrTakeTheReportedPoint) {
    // No usable level at all: the top reading four times, zero value and phase, no failure.
    std::vector<Reading> positive(7, Reading{-3, 0.2f, 4});
    // Compression stops at 0.3 dB, well past level 2 and at a higher power: level 3 takes
    // the reported point.
    auto deeper = compressing({0, -0.02f, -0.05f, -0.1f, -0.2f, -0.3f, -0.3f});
    // Compression stops at 0.2 dB: level 3 takes level 2's point.
    auto flat = compressing({0, -0.02f, -0.05f, -0.1f, -0.2f, -0.2f, -0.2f});
    Measured data({1e9, 2e9, 3e9}, {positive, deeper, flat});
    auto result = data.judge();
    EXPECT_TRUE(result.passed);
    for (std::size_t k = 0; k < 4; ++k) {
        EXPECT_EQ(result.image.point(0, k), (storage::CompressionPoint{-3, 0, 0}));
    }
    EXPECT_EQ(result.image.point(1, 3), (storage::CompressionPoint{-0.3f, -0.3f, -0.3f * 3}));
    EXPECT_EQ(result.image.point(2, 3), result.image.point(2, 2));
    EXPECT_FLOAT_EQ(result.image.point(2, 2).value, -0.2f);
    // The raw line shows the copy, not the reported point.
    EXPECT_NE(data.raw().find("\n3000000000, (-20.049999,-0.050000001,-0.15000001), "
                              "(-15.1,-0.1,-0.30000001), (-10.2,-0.2,-0.60000002), "
                              "(-10.2,-0.2,-0.60000002)"),
              std::string::npos);
    EXPECT_EQ(count(data.raw(), "FAILED"), 0);
}

TEST(JudgeResults, StopFlagCopiesTheLevelUpward) {
    // The clip sits just above level 1's reading: levels 2 and 3 take its point.
    Measured data({1e9}, {compressing(kHealthy)}, {-14.5, 1.0, 0.5f, 50e9, false, false});
    auto result = data.judge();
    EXPECT_TRUE(result.passed);
    EXPECT_FLOAT_EQ(result.image.point(0, 1).value, -0.1f);
    EXPECT_EQ(result.image.point(0, 2), result.image.point(0, 1));
    EXPECT_EQ(result.image.point(0, 3), result.image.point(0, 1));
}

TEST(JudgeResults, CriteriaMarkEveryFailingPairAndAskOnce) {
    // Level 2 jumps to 0.49 dB, level 3 reads 0.5: compression grows by only 0.01 dB.
    auto exactStep = compressing({0, -0.02f, -0.05f, -0.1f, -0.49f, -0.5f, -1.0f});
    // Too deep for level 1 (0.25 dB), and level 3's power below level 2's: two failing pairs.
    std::vector<Reading> tooDeep = {{-30, 0},          {-25, -0.02f},     {-20.05f, -0.05f},
                                    {-15.25f, -0.25f}, {-10.45f, -0.45f}, {-10.5f, -0.9f},
                                    {-1, -1}};
    CCompressionData::Limits limits{10.0, 1.0, 1.0f, 50e9, false, false};
    Measured data({1e9, 2e9}, {exactStep, tooDeep}, limits);
    data.ui.badData({platform::BadDataChoice::Retest});
    auto result = data.judge("B");
    EXPECT_FALSE(result.passed);
    EXPECT_FALSE(result.accepted);
    EXPECT_EQ(data.ui.badDataReceivers(), std::vector<std::string>{"B"});
    const std::string raw = data.raw();
    EXPECT_EQ(count(raw, "\nDATA AT ABOVE FREQUENCY FAILED BAD CONNECTION CRITERIA"), 3);
    // The first frequency's single line follows its own raw line.
    const auto first = raw.find("\n1000000000,");
    const auto second = raw.find("\n2000000000,");
    EXPECT_EQ(count(raw.substr(first, second - first), "FAILED"), 1);
}

TEST(JudgeResults, TheOperatorDecidesOnBadData) {
    auto bad = compressing({0, -0.02f, -0.05f, -0.1f, -0.49f, -0.5f, -1.0f});
    CCompressionData::Limits limits{10.0, 1.0, 1.0f, 50e9, false, false};
    {
        Measured data({1e9, 2e9}, {bad, compressing(kHealthy)}, limits, {1e6});
        data.ui.badData({platform::BadDataChoice::Continue});
        auto result = data.judge("C");
        EXPECT_TRUE(result.accepted);
        const auto boxes = data.ui.boxes();
        ASSERT_EQ(boxes.size(), 1u);
        const auto& box = boxes[0].box;
        EXPECT_EQ(box.caption, "Warning");
        EXPECT_EQ(box.text,
                  "The characterization for receiver C has been defaulted. This will create "
                  "\npoor receiver measurements at higher input powers.  For proper "
                  "functionality,\nthis receiver, C, should be re-characterized from the "
                  "Receiver Characterization \nselection screen after ensuring the quality and "
                  "cleanliness of all \nequipment and connections.\n\nPress OK to continue.");
        EXPECT_EQ(result.image.recordsPresent(), 3u);
        EXPECT_EQ(result.image.frequency(2), 2e9);
        for (std::size_t record = 1; record < 3; ++record) {
            for (std::size_t k = 0; k < 4; ++k) {
                EXPECT_EQ(result.image.point(record, k), storage::CompressionPoint{});
            }
        }
    }
    {
        Measured data({1e9}, {bad}, limits);
        data.ui.badData({platform::BadDataChoice::Quit});
        EXPECT_EQ(testsupport::errorOf([&] { data.judge("R2"); }),
                  "User aborted characterization due to bad data on receiver R2");
    }
}

TEST(JudgeResults, FrequenciesAboveTheMeasuredRange) {
    CCompressionData::Limits limits{10.0, 1.0, 0.5f, 2e9, false, false};
    auto flat = compressing({0, 0, 0, 0, 0, 0, -0.06f});
    {
        // Within 0.1 Hz of the maximum counts as above it and repeats the previous points.
        Measured data({1e9, 2e9 - 0.05, 3e9}, {compressing(kHealthy), flat, flat}, limits);
        auto result = data.judge();
        EXPECT_EQ(result.image.recordsPresent(), 3u);
        EXPECT_EQ(result.image.point(1, 0), result.image.point(0, 0));
        EXPECT_EQ(result.image.point(2, 3), result.image.point(0, 3));
    }
    {
        // Millimetre-wave: the image ends before the first such frequency, and says so.
        Measured data({1e9, 3e9, 4e9}, {compressing(kHealthy), flat, flat}, limits, {1e6});
        auto result = data.judge("A", true);
        EXPECT_EQ(result.image.recordsPresent(), 2u);
        EXPECT_EQ(result.image.announcedRecords(), 2u);
        EXPECT_EQ(result.image.wordCount(), 11u + 2u * 28u);
        EXPECT_EQ(result.image.defect(), "");
    }
    {
        // Nothing below the range: the first record holds zeros.
        Measured data({3e9}, {compressing(kHealthy)}, limits);
        auto result = data.judge();
        EXPECT_EQ(result.image.point(0, 0), storage::CompressionPoint{});
    }
}
