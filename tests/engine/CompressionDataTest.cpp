#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

#include "ErrorOf.h"
#include "TempDir.h"
#include "engine/CompressionData.h"
#include "platform/ScriptedOperatorUi.h"

using engine::CCompressionData;

namespace {

using testsupport::errorOf;

std::vector<std::string> lines(const std::string& text) {
    std::vector<std::string> result;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        result.push_back(line);
    }
    return result;
}

// A store with one frequency and the given readings per power level (lowest power first).
struct OneFrequency {
    platform::ScriptedOperatorUi ui;
    CCompressionData store{ui};

    OneFrequency(std::vector<float> test, std::vector<float> ratio, std::vector<float> phase,
                 CCompressionData::Limits limits = {10.0, 1.0, 0.5f, 1e12, false, false}) {
        store.setLimits(limits);
        store.setFrequencies({1e9}, {});
        store.setPowerLevels(std::vector<double>(test.size(), 0.0));
        for (std::size_t i = 0; i < test.size(); ++i) {
            const int level = static_cast<int>(i);
            store.putTrace("TestMag", std::vector<float>{test[i]}, level);
            store.putTrace("RatioMag", std::vector<float>{ratio[i]}, level);
            store.putTrace("Phase", std::vector<float>{phase[i]}, level);
        }
    }

    bool search(float level, float tolerance, bool first, int& start, bool& stop) {
        return store.findCompressionPoint(level, tolerance, 0, first, start, stop);
    }
};

}  // namespace

TEST(PutTrace, FilesRowsAppendsSegmentsAndRejectsBadInput) {
    platform::ScriptedOperatorUi ui;
    ui.answerAll(platform::Answer::Ok);
    CCompressionData store(ui);
    store.setPowerLevels({-30, -28, -26});

    // A level beyond the table lands as the next row, whatever number it carries.
    store.putTrace("TestMag", std::vector<float>{1, 2}, 3);
    ASSERT_EQ(store.testMag().size(), 1u);
    EXPECT_EQ(store.testMag()[0], (std::vector<float>{1, 2}));

    // Filing a level again extends its row: the second band segment.
    store.putTrace("RatioMag", std::vector<float>{-0.1f}, 0);
    store.putTrace("RatioMag", std::vector<float>{-0.2f, -0.3f}, 0);
    ASSERT_EQ(store.ratioMag().size(), 1u);
    EXPECT_EQ(store.ratioMag()[0], (std::vector<float>{-0.1f, -0.2f, -0.3f}));

    EXPECT_EQ(errorOf([&] { store.putTrace("Phase", std::vector<float>{1}, -1); }),
              "Bad trace number passed to putTrace");
    EXPECT_EQ(errorOf([&] { store.putTrace("Phase", std::vector<float>{1}, 4); }),
              "Bad trace number passed to putTrace");

    // The type is compared exactly: a lower-case m is unknown and stores nothing.
    store.putTrace("Ratiomag", std::vector<float>{9}, 0);
    ASSERT_EQ(ui.boxes().size(), 1u);
    EXPECT_EQ(ui.boxes()[0].box.caption, "ERROR");
    EXPECT_EQ(ui.boxes()[0].box.text, "Unknown Trace Type in CCompressionData::putTrace");
    EXPECT_EQ(store.ratioMag()[0].size(), 3u);
    EXPECT_TRUE(store.phase().empty());

    store.clearMeasurements();
    EXPECT_TRUE(store.testMag().empty());
    EXPECT_TRUE(store.ratioMag().empty());
    EXPECT_EQ(store.getPowerCount(), 3);
}

TEST(MeasuredDataExport, WritesHeaderPrecisionsAndRepeatsShortRows) {
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.setPowerLevels({-30, -2.5});
    store.setFrequencies({10000000.123456789, 2e9, 3e9}, {});
    for (int level = 0; level < 2; ++level) {
        store.putTrace("TestMag", std::vector<float>{-30.123456789f, -29.5f, -29.25f}, level);
        store.putTrace("Phase", std::vector<float>{0.5f, 1.5f, 2.5f}, level);
    }
    store.putTrace("RatioMag", std::vector<float>{-0.0123456789f, -0.02f, -0.03f}, 0);
    // The top level holds only the first segment's reading.
    store.putTrace("RatioMag", std::vector<float>{-0.5f}, 1);

    testsupport::TempDir dir;
    store.writeAllMeasuredData("R1_LFE", dir.path());
    auto text = testsupport::readFile(dir / "RcvrChar_AllMeasuredData_R1_LFE.csv");
    auto rows = lines(text);
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0], "Freq,Rec Pow(-30),Mag(-30),Phase(-30),Rec Pow(-2.5),Mag(-2.5),Phase(-2.5)");
    EXPECT_EQ(rows[1], "10000000.1234568,-30.123457,-0.012345679,0.5,-30.123457,-0.5,0.5");
    // Rows shorter than the frequency list repeat their last readings.
    EXPECT_EQ(rows[3], "3000000000,-29.25,-0.029999999,2.5,-29.25,-0.5,2.5");
    EXPECT_EQ(text.back(), '\n');
    EXPECT_EQ(text.find('\r'), std::string::npos);

    // An unwritable place is skipped without an error.
    EXPECT_NO_THROW(store.writeAllMeasuredData("A", dir / "missing" / "deeper"));
}

TEST(WrapPhase, FoldsWholeTurnsAndTheOuterBand) {
    EXPECT_FLOAT_EQ(engine::wrapPhase(310), -50);
    EXPECT_FLOAT_EQ(engine::wrapPhase(-310), 50);
    EXPECT_FLOAT_EQ(engine::wrapPhase(725), 5);
    EXPECT_FLOAT_EQ(engine::wrapPhase(300), 300);
    EXPECT_FLOAT_EQ(engine::wrapPhase(-719.5f), 0.5f);
}

TEST(FindCompressionPoint, DownwardSearchSettlesOnFirstLevelWithinTolerance) {
    // Levels from low to high power: linear, then compressing.
    OneFrequency data({-20, -15, -10.05f, -5.2f, -0.6f}, {-0.001f, -0.01f, -0.05f, -0.2f, -0.6f},
                      {0, 0, 0.5f, 1, 370});
    int start = -1;
    bool stop = true;
    EXPECT_TRUE(data.search(0.05f, 0.006f, true, start, stop));
    EXPECT_FALSE(stop);
    EXPECT_EQ(start, 2);
    EXPECT_FLOAT_EQ(data.store.compressionPower(), -10.05f);
    EXPECT_FLOAT_EQ(data.store.compressionValue(), -0.05f);
    EXPECT_FLOAT_EQ(data.store.compressionPhase(), 0.5f);

    // The next level walks upward from the level after.
    start = 3;
    EXPECT_TRUE(data.search(0.1f, 0.008f, false, start, stop));
    EXPECT_EQ(start, 3);
    EXPECT_FLOAT_EQ(data.store.compressionValue(), -0.2f);

    start = 4;
    EXPECT_TRUE(data.search(0.5f, 0.01f, false, start, stop));
    EXPECT_FLOAT_EQ(data.store.compressionPhase(), 10);  // 370 wrapped
}

TEST(FindCompressionPoint, ClipAndDeltaDecideUsabilityAndStop) {
    // Every level at or above the clip: nothing usable, power lowered to the clip.
    OneFrequency clipped({11, 12, 13}, {-0.1f, -0.2f, -0.3f}, {0, 0, 0});
    int start = -1;
    bool stop = false;
    EXPECT_FALSE(clipped.search(0.05f, 0.006f, true, start, stop));
    EXPECT_FLOAT_EQ(clipped.store.compressionValue(), 0);
    EXPECT_FLOAT_EQ(clipped.store.compressionPower(), 10);
    EXPECT_TRUE(stop);

    // A level found within delta of the clip stops the higher levels.
    OneFrequency nearClip({5, 9.5f}, {-0.01f, -0.11f}, {0, 0});
    start = 0;
    EXPECT_TRUE(nearClip.search(0.1f, 0.008f, false, start, stop));
    EXPECT_EQ(start, 1);
    EXPECT_TRUE(stop);

    // Positive ratio readings are never usable.
    OneFrequency positive({-10, -5}, {0.2f, 0.3f}, {0, 0});
    start = -1;
    EXPECT_FALSE(positive.search(0.05f, 0.006f, true, start, stop));
    EXPECT_FLOAT_EQ(positive.store.compressionPower(), -5);
}

TEST(FindCompressionPoint, OptionFlagAndPhaseDecideAShallowTopLevel) {
    CCompressionData::Limits plain{10.0, 1.0, 0.5f, 1e12, false, false};
    CCompressionData::Limits option = plain;
    option.option210 = true;

    int start = -1;
    bool stop = false;
    OneFrequency withoutOption({-10, -5}, {0.1f, -0.03f}, {0, 0}, plain);
    EXPECT_FALSE(withoutOption.search(0.05f, 0.006f, true, start, stop));
    OneFrequency withOption({-10, -5}, {0.1f, -0.03f}, {0, 0}, option);
    EXPECT_TRUE(withOption.search(0.05f, 0.006f, true, start, stop));
    EXPECT_FLOAT_EQ(withOption.store.compressionValue(), -0.03f);

    OneFrequency phaseLarge({-10, -5}, {0.1f, -0.005f}, {0, 0.2f}, option);
    EXPECT_TRUE(phaseLarge.search(0.05f, 0.006f, true, start, stop));
    EXPECT_FLOAT_EQ(phaseLarge.store.compressionValue(), 0.00001f);
    OneFrequency phaseSmall({-10, -5}, {0.1f, -0.005f}, {0, 0.05f}, option);
    EXPECT_FALSE(phaseSmall.search(0.05f, 0.006f, true, start, stop));

    // Other levels never get the option's leniency.
    OneFrequency otherLevel({-10, -5}, {0.1f, -0.03f}, {0, 0.5f}, option);
    EXPECT_FALSE(otherLevel.search(0.1f, 0.008f, true, start, stop));
}

TEST(FindCompressionPoint, UpwardWalkFallsBackToMostCompressedAndT3951Fall) {
    // Compression never reaches 0.5 dB; the deepest reading was at level 1.
    OneFrequency shallow({-10, -5, 0}, {-0.05f, -0.3f, -0.2f}, {1, 2, 3});
    int start = 0;
    bool stop = false;
    EXPECT_FALSE(shallow.search(0.5f, 0.01f, false, start, stop));
    EXPECT_FLOAT_EQ(shallow.store.compressionPower(), -5);
    EXPECT_FLOAT_EQ(shallow.store.compressionValue(), -0.3f);
    EXPECT_FLOAT_EQ(shallow.store.compressionPhase(), 2);
    EXPECT_EQ(start, 0);  // best - 1

    // A start index past the top is pulled back to the top level.
    start = 7;
    EXPECT_TRUE(shallow.search(0.2f, 0.01f, false, start, stop));
    EXPECT_EQ(start, 2);

    // On T3951 a reading that falls while the power rises ends the walk unreached.
    CCompressionData::Limits t3951{10.0, 1.0, 0.5f, 1e12, true, false};
    OneFrequency falling({-10, -10.5f, -9}, {-0.01f, -0.02f, -0.6f}, {0, 0, 0}, t3951);
    start = 0;
    EXPECT_FALSE(falling.search(0.5f, 0.01f, false, start, stop));
    EXPECT_EQ(start, 1);
    OneFrequency rising({-10, -9.9f, -9}, {-0.01f, -0.02f, -0.6f}, {0, 0, 0}, t3951);
    start = 0;
    EXPECT_TRUE(rising.search(0.5f, 0.01f, false, start, stop));
}

TEST(FindCompressionPoint, ShortRowsAreNeverReadPastTheirEnd) {
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.setLimits({10.0, 1.0, 0.5f, 1e12, false, false});
    store.setPowerLevels({-10, -5, 0});
    store.putTrace("TestMag", std::vector<float>{-10, -9}, 0);
    store.putTrace("RatioMag", std::vector<float>{-0.06f, -0.07f}, 0);
    store.putTrace("Phase", std::vector<float>{0, 0}, 0);
    int start = -1;
    bool stop = false;
    // Only level 0 exists, and frequency 5 lies beyond every row.
    EXPECT_TRUE(store.findCompressionPoint(0.05f, 0.006f, 1, true, start, stop));
    EXPECT_EQ(start, 0);
    EXPECT_FALSE(store.findCompressionPoint(0.05f, 0.006f, 5, true, start, stop));
}
