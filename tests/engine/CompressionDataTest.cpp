#include <gtest/gtest.h>

#include <map>
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

// What one search reports: found, the start index it leaves, and the stop flag.
struct Found {
    bool found;
    int start;
    bool stop;
    bool operator==(const Found&) const = default;
};

void PrintTo(const Found& r, std::ostream* out) {
    *out << "{found " << r.found << ", start " << r.start << ", stop " << r.stop << "}";
}

// stop starts true: every search must set it.
Found search(CCompressionData& store, float level, float tolerance, bool first, int start = -1,
             int frequency = 0) {
    bool stop = true;
    const bool found = store.findCompressionPoint(level, tolerance, frequency, first, start, stop);
    return {found, start, stop};
}

constexpr CCompressionData::Limits kPlain{10.0, 1.0, 0.5f, 1e12, false, false};

// A store with one frequency and the given readings per power level (lowest power first).
struct OneFrequency {
    platform::ScriptedOperatorUi ui;
    CCompressionData store{ui};

    OneFrequency(std::vector<float> test, std::vector<float> ratio, std::vector<float> phase,
                 CCompressionData::Limits limits = kPlain) {
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

    Found search(float level, float tolerance, bool first, int start = -1) {
        return ::search(store, level, tolerance, first, start);
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

    // An unwritable place is an error naming the file; the run reports it and goes on.
    const std::string error =
        testsupport::errorOf([&] { store.writeAllMeasuredData("A", dir / "missing" / "deeper"); });
    EXPECT_EQ(error.rfind("Cannot write the raw measured data RcvrChar_AllMeasuredData_A.csv (" +
                              (dir / "missing" / "deeper").string(),
                          0),
              0u)
        << error;
}

TEST(MeasuredDataExport, ManyFrequenciesKeepEveryReadingInItsColumn) {
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.setPowerLevels({-30});
    std::vector<double> frequencies;
    std::vector<float> test, ratio, phase;
    for (int j = 0; j < 150; ++j) {
        frequencies.push_back(1e6 * (j + 1));
        test.push_back(static_cast<float>(j));
        phase.push_back(static_cast<float>(-j));
        if (j < 100) {
            ratio.push_back(static_cast<float>(j) + 0.5f);
        }
    }
    store.setFrequencies(std::move(frequencies), {});
    store.putTrace("TestMag", test, 0);
    store.putTrace("RatioMag", ratio, 0);
    store.putTrace("Phase", phase, 0);

    testsupport::TempDir dir;
    store.writeAllMeasuredData("A", dir.path());
    const auto rows = lines(testsupport::readFile(dir / "RcvrChar_AllMeasuredData_A.csv"));
    ASSERT_EQ(rows.size(), 151u);
    for (int j = 0; j < 150; ++j) {
        const std::string expected = std::to_string(1000000 * (j + 1)) + "," + std::to_string(j) +
                                     "," + std::to_string(std::min(j, 99)) + ".5," +
                                     (j == 0 ? "0" : "-" + std::to_string(j));
        EXPECT_EQ(rows[static_cast<std::size_t>(j) + 1], expected) << j;
    }
}

TEST(WrapPhase, FoldsWholeTurnsAndTheOuterBand) {
    EXPECT_FLOAT_EQ(engine::wrapPhase(310), -50);
    EXPECT_FLOAT_EQ(engine::wrapPhase(-310), 50);
    EXPECT_FLOAT_EQ(engine::wrapPhase(725), 5);
    EXPECT_FLOAT_EQ(engine::wrapPhase(300), 300);
    EXPECT_FLOAT_EQ(engine::wrapPhase(-719.5f), 0.5f);
}

TEST(FindCompressionPoint, DownwardSearchThenUpwardWalkPerLevel) {
    // Levels from low to high power: linear, then compressing.
    OneFrequency data({-20, -15, -10.05f, -5.2f, -0.6f}, {-0.001f, -0.01f, -0.05f, -0.2f, -0.6f},
                      {0, 0, 0.5f, 1, 370});
    EXPECT_EQ(data.search(0.05f, 0.006f, true), (Found{true, 2, false}));
    EXPECT_FLOAT_EQ(data.store.compressionPower(), -10.05f);
    EXPECT_FLOAT_EQ(data.store.compressionValue(), -0.05f);
    EXPECT_FLOAT_EQ(data.store.compressionPhase(), 0.5f);
    EXPECT_EQ(data.search(0.1f, 0.008f, false, 3), (Found{true, 3, false}));
    EXPECT_FLOAT_EQ(data.store.compressionValue(), -0.2f);
    EXPECT_EQ(data.search(0.5f, 0.01f, false, 4), (Found{true, 4, false}));
    EXPECT_FLOAT_EQ(data.store.compressionPhase(), 10);  // 370 wrapped

    // Compression never reaches 0.5 dB: the deepest reading (level 1) is reported.
    OneFrequency shallow({-10, -5, 0}, {-0.05f, -0.3f, -0.2f}, {1, 2, 3});
    EXPECT_EQ(shallow.search(0.5f, 0.01f, false, 0), (Found{false, 0, false}));  // best - 1
    EXPECT_FLOAT_EQ(shallow.store.compressionPower(), -5);
    EXPECT_FLOAT_EQ(shallow.store.compressionValue(), -0.3f);
    EXPECT_FLOAT_EQ(shallow.store.compressionPhase(), 2);
    // A start index past the top is pulled back to the top level.
    EXPECT_EQ(shallow.search(0.2f, 0.01f, false, 7), (Found{true, 2, false}));
}

TEST(FindCompressionPoint, UsabilityClipOptionAndModelRules) {
    auto option = kPlain;
    option.option210 = true;
    auto t3951 = kPlain;
    t3951.t3951 = true;
    const std::map<float, float> tolerance = {{0.05f, 0.006f}, {0.1f, 0.008f}, {0.5f, 0.01f}};
    // One frequency's readings from low to high power, searched once for one level.
    const auto expect = [&](const char* what, std::vector<float> test, std::vector<float> ratio,
                            std::vector<float> phase, CCompressionData::Limits limits, float level,
                            bool first, int start, Found found, float value) {
        OneFrequency data(test, ratio, phase, limits);
        EXPECT_EQ(data.search(level, tolerance.at(level), first, start), found) << what;
        EXPECT_FLOAT_EQ(data.store.compressionValue(), value) << what;
    };
    // Every level at or above the clip: nothing usable, and the stop flag is raised.
    expect("clipped", {11, 12, 13}, {-0.1f, -0.2f, -0.3f}, {0, 0, 0}, kPlain, 0.05f, true, -1,
           {false, -1, true}, 0);
    // A level found within delta of the clip stops the higher levels.
    expect("near clip", {5, 9.5f}, {-0.01f, -0.11f}, {0, 0}, kPlain, 0.1f, false, 0,
           {true, 1, true}, -0.11f);
    expect("positive ratio", {-10, -5}, {0.2f, 0.3f}, {0, 0}, kPlain, 0.05f, true, -1,
           {false, -1, false}, 0);
    // A shallow top level passes at 0.05 dB only with the option...
    expect("no option", {-10, -5}, {0.1f, -0.03f}, {0, 0}, kPlain, 0.05f, true, -1,
           {false, 1, false}, -0.03f);
    expect("option", {-10, -5}, {0.1f, -0.03f}, {0, 0}, option, 0.05f, true, -1, {true, 1, false},
           -0.03f);
    // ...or, shallower still, with a large phase, reported as a token value.
    expect("large phase", {-10, -5}, {0.1f, -0.005f}, {0, 0.2f}, option, 0.05f, true, -1,
           {true, 1, false}, 0.00001f);
    expect("small phase", {-10, -5}, {0.1f, -0.005f}, {0, 0.05f}, option, 0.05f, true, -1,
           {false, 1, false}, -0.005f);
    expect("other level", {-10, -5}, {0.1f, -0.03f}, {0, 0.5f}, option, 0.1f, true, -1,
           {false, 1, false}, -0.03f);
    // On T3951 a reading that falls while the power rises ends the walk unreached.
    expect("T3951 falling", {-10, -10.5f, -9}, {-0.01f, -0.02f, -0.6f}, {0, 0, 0}, t3951, 0.5f,
           false, 0, {false, 1, false}, -0.02f);
    expect("T3951 rising", {-10, -9.9f, -9}, {-0.01f, -0.02f, -0.6f}, {0, 0, 0}, t3951, 0.5f, false,
           0, {true, 2, false}, -0.6f);

    // Nothing usable: the power reported is the top level's, lowered to the clip.
    OneFrequency clipped({11, 12, 13}, {-0.1f, -0.2f, -0.3f}, {0, 0, 0});
    clipped.search(0.05f, 0.006f, true);
    EXPECT_FLOAT_EQ(clipped.store.compressionPower(), 10);
    OneFrequency positive({-10, -5}, {0.2f, 0.3f}, {0, 0});
    positive.search(0.05f, 0.006f, true);
    EXPECT_FLOAT_EQ(positive.store.compressionPower(), -5);
}

TEST(FindCompressionPoint, ShortRowsAreNeverReadPastTheirEnd) {
    platform::ScriptedOperatorUi ui;
    CCompressionData store(ui);
    store.setLimits(kPlain);
    store.setPowerLevels({-10, -5, 0});
    store.putTrace("TestMag", std::vector<float>{-10, -9}, 0);
    store.putTrace("RatioMag", std::vector<float>{-0.06f, -0.07f}, 0);
    store.putTrace("Phase", std::vector<float>{0, 0}, 0);
    // Only level 0 exists, and frequency 5 lies beyond every row.
    EXPECT_EQ(search(store, 0.05f, 0.006f, true, -1, 1), (Found{true, 0, false}));
    EXPECT_EQ(search(store, 0.05f, 0.006f, true, 0, 5), (Found{false, 0, false}));
}
