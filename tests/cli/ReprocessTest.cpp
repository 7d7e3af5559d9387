#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <nlohmann/json.hpp>

#include "RunRcvrchar.h"

namespace {

using clitest::CommandRun;
using clitest::runRcvrchar;

using clitest::quotedSample;

// A raw CSV for test receiver A of the T3871B as a run would write it: the plan's frequencies
// and ladder from the configuration, readings of a receiver compressing as Rapp's model with
// the given saturation power (a huge one never compresses).
std::string measuredCsv(const testsupport::TempDir& dir, double psat) {
    EXPECT_EQ(runRcvrchar(dir, "config show --file " + quotedSample() + " --model T3871B").status,
              0);
    const auto config = nlohmann::json::parse(testsupport::readFile(dir / "out.txt"));
    const auto& constants = config["constants"];
    const double start = constants["TESTSTARTPOWER"], stop = constants["TESTSTOPPOWER"],
                 step = constants["TESTPOWERSTEP"];
    std::vector<double> ladder;
    for (double p = start; p <= stop + 1e-9; p += step) {
        ladder.push_back(p);
    }
    auto text = [](const char* format, double value) {
        char buffer[64];
        std::snprintf(buffer, sizeof buffer, format, value);
        return std::string(buffer);
    };
    std::string csv = "Freq";
    for (double p : ladder) {
        csv += ",Rec Pow(" + text("%g", p) + "),Mag(" + text("%g", p) + "),Phase(" + text("%g", p) +
               ")";
    }
    csv += "\n";
    const int minband = constants["MINBAND"], maxband = constants["MAXBAND"];
    for (const auto& band : config["bands"]) {
        const int number = band["band"];
        if (number < minband || number > maxband) {
            continue;
        }
        const double first = band["start"], last = band["stop"];
        const int points = band["points"];
        for (int k = 0; k < points; ++k) {
            csv += text("%.15g", first + k * ((last - first) / (points - 1.0)));
            for (double p : ladder) {
                const double c = -(10.0 / 2) * std::log10(1 + std::pow(10, 2 * (p - psat) / 10));
                csv +=
                    "," + text("%.8g", p + c) + "," + text("%.8g", c) + "," + text("%.8g", 3 * c);
            }
            csv += "\n";
        }
    }
    return csv;
}

const std::string kArguments =
    "reprocess --csv in.csv --receiver A --model T3871B --options 010 --out . --file ";

}  // namespace

TEST(ReprocessCommand, HealthyDataWritesTheRawFileAndTheImage) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "in.csv", measuredCsv(dir, -8));
    const CommandRun result = runRcvrchar(dir, kArguments + quotedSample());
    ASSERT_EQ(result.status, 0) << result.err;
    const std::string image = testsupport::readFile(dir / "RcvrChar_A.dat");
    ASSERT_GE(image.size(), 22u);
    std::uint32_t records = 0;
    std::memcpy(&records, image.data() + 2, 4);
    EXPECT_EQ(image.size(), 22u + 56u * records);
    const std::string raw = testsupport::readFile(dir / "rcvrCharRaw_A.txt");
    EXPECT_EQ(raw.rfind("1\nA\n25\n-3\n30\n", 0), 0u) << raw.substr(0, 40);
    EXPECT_EQ(raw.find("FAILED"), std::string::npos);
}

TEST(ReprocessCommand, BadDataFailsWithStatusTwoAndTheChosenImage) {
    testsupport::TempDir dir;
    // Compression far beyond every level at the lowest power: no growth between levels.
    testsupport::writeFile(dir / "in.csv", measuredCsv(dir, -80));
    CommandRun retest = runRcvrchar(dir, kArguments + quotedSample());
    EXPECT_EQ(retest.status, 2);
    EXPECT_EQ(retest.err, "The data of receiver A failed the bad-connection criteria\n");
    EXPECT_FALSE(std::filesystem::exists(dir / "RcvrChar_A.dat"));

    CommandRun quit = runRcvrchar(dir, kArguments + quotedSample() + " --on-bad-data quit");
    EXPECT_EQ(quit.status, 2);
    EXPECT_EQ(quit.err, "User aborted characterization due to bad data on receiver A\n");

    CommandRun defaulted = runRcvrchar(dir, kArguments + quotedSample() + " --on-bad-data default");
    EXPECT_EQ(defaulted.status, 2);
    const std::string image = testsupport::readFile(dir / "RcvrChar_A.dat");
    ASSERT_GT(image.size(), 22u + 56u);
    // Every record keeps its frequency and holds zeros after it.
    for (std::size_t record = 22; record < image.size(); record += 56) {
        EXPECT_EQ(image.substr(record + 8, 48), std::string(48, '\0'));
    }
}

TEST(ReprocessCommand, ErrorsGoToStderrWithStatusOne) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "in.csv", "Freq,Rec Pow(-30),Mag(-30),Phase(-30)\n");
    CommandRun result = runRcvrchar(dir, kArguments + quotedSample());
    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.err.find("in.csv line 1: the header does not name the"), std::string::npos)
        << result.err;

    CommandRun unknown =
        runRcvrchar(dir,
                    "reprocess --csv in.csv --receiver Q --model T3871B --options ' 010 ' --out . "
                    "--file " +
                        quotedSample());
    EXPECT_EQ(unknown.status, 1);
    EXPECT_EQ(unknown.err,
              "--receiver Q is not a receiver of the T3871B with options \" 010 \"; "
              "its receivers are R1, R2, A, B\n");

    CommandRun noFile = runRcvrchar(
        dir, "reprocess --csv in.csv --receiver A --model T3871B --out . --file missing.dat");
    EXPECT_EQ(noFile.status, 1);
    EXPECT_NE(noFile.err.find("missing.dat"), std::string::npos) << noFile.err;
}

// A reading that is not a finite number (a run writes one when a trace read fails) fails the
// criteria at its frequency: a result built on it never passes.
TEST(ReprocessCommand, NonFiniteReadingsFailTheCriteriaAtTheirFrequency) {
    testsupport::TempDir dir;
    const std::string healthy = measuredCsv(dir, -8);
    const std::string header = healthy.substr(0, healthy.find('\n'));
    const auto readings = static_cast<std::size_t>(std::count(header.begin(), header.end(), ','));
    for (const std::string bad : {"nan", "-inf"}) {
        SCOPED_TRACE(bad);
        // The fourth frequency reads `bad` at every level.
        std::string csv;
        std::size_t start = 0;
        for (int line = 0; start < healthy.size(); ++line) {
            const std::size_t end = healthy.find('\n', start);
            std::string text = healthy.substr(start, end - start);
            if (line == 4) {
                text = text.substr(0, text.find(','));
                for (std::size_t c = 0; c < readings; ++c) {
                    text += "," + bad;
                }
            }
            csv += text + "\n";
            start = end + 1;
        }
        testsupport::writeFile(dir / "in.csv", csv);
        const CommandRun result = runRcvrchar(dir, kArguments + quotedSample());
        EXPECT_EQ(result.status, 2) << result.err;
        const std::string raw = testsupport::readFile(dir / "rcvrCharRaw_A.txt");
        std::size_t failed = 0;
        for (auto at = raw.find("FAILED"); at != std::string::npos;
             at = raw.find("FAILED", at + 1)) {
            ++failed;
        }
        EXPECT_GE(failed, 1u);
    }
}
