#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>

#include "ErrorOf.h"
#include "SimFixture.h"
#include "platform/PathMap.h"
#include "sim/FlashStore.h"
#include "sim/ReceiverPhysics.h"
#include "sim/SimProcessRunner.h"

namespace {

using simtest::SimFixture;

std::string flashWrite(const std::string& name, const std::vector<unsigned>& words) {
    std::string command = "DIAG:FLASHARRAY \"RcvrChar\",\"" + name + "\"";
    for (unsigned w : words) {
        command += ", " + std::to_string(w);
    }
    return command;
}

// The date the catalog reader computes ages from: month/day/year of the first field.
std::string todayText(int daysAgo = 0) {
    std::time_t now = std::time(nullptr) - daysAgo * 86400;
    std::tm t{};
    localtime_r(&now, &t);
    char text[16];
    std::strftime(text, sizeof text, "%m/%d/%Y", &t);
    return text;
}

std::vector<std::string> fields(const std::string& line) {
    std::vector<std::string> out;
    std::size_t start = 0;
    while ((start = line.find_first_not_of(' ', start)) != std::string::npos) {
        std::size_t end = line.find(' ', start);
        out.push_back(line.substr(start, end - start));
        start = end;
    }
    return out;
}

class Flash : public SimFixture {};

TEST_F(Flash, ArrayWritesReadBackWithOneLeadingCharacterAndBadOnesChangeNothing) {
    start();
    EXPECT_EQ("", scpi(flashWrite("A", {1, 0, 0, 4, 65535})));
    EXPECT_EQ(",1,0,0,4,65535", scpi("DIAG:flasharray? \"rcvrchar\",\"a\""));
    EXPECT_EQ("0,\"No error\"", nextError());
    scpi(flashWrite("A", {7}));
    EXPECT_EQ(",7", scpi("DIAG:flasharray? \"RCVRCHAR\",\"A\""));

    scpi(flashWrite("B", {1, 2}));
    scpi(flashWrite("B", {1, 65536}));
    scpi("DIAG:FLASHARRAY \"RcvrChar\",\"B\", 1, x");
    scpi("DIAG:FLASHARRAY \"RcvrChar\",\"..\\evil\", 1");
    scpi("DIAG:flasharray? \"RCVRCHAR\",\"C\"");
    EXPECT_EQ("-222,\"Data out of range; flash words are 0 to 65535\"", nextError());
    EXPECT_EQ("-104,\"Data type error; unsigned number expected\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; bad flash calibration name \"..\\evil\"\"",
              nextError());
    EXPECT_EQ("-256,\"File name not found; RCVRCHAR\\C\"", nextError());
    EXPECT_EQ(",1,2", scpi("DIAG:flasharray? \"RCVRCHAR\",\"B\""));
}

TEST_F(Flash, CatalogListsDateFirstAndTheNameFourth) {
    start(R"({"stored": [{"receiver": "R1", "age_days": 3, "records": 2},
                         {"receiver": "A", "age_days": 10, "words": 500}]})");
    scpi(flashWrite("R1_LFE", {1, 2, 3}));
    std::string catalog = scpi("DIAG:FLASH:CAT?");
    auto lines = simtest::splitLines(catalog);
    ASSERT_EQ(3u, lines.size()) << catalog;
    // Date, bytes and name: the time of day in the second field varies.
    auto entry = [](const std::string& line) {
        auto f = fields(line);
        return f.size() == 4 ? f[0] + " " + f[2] + " " + f[3] : line;
    };
    EXPECT_EQ(todayText(10) + " 1000 RCVRCHAR\\A", entry(lines[0]));
    EXPECT_EQ(todayText(3) + " " + std::to_string((11 + 2 * 28) * 2) + " RCVRCHAR\\R1",
              entry(lines[1]));
    EXPECT_EQ(todayText() + " 6 RCVRCHAR\\R1_LFE", entry(lines[2]));
}

TEST_F(Flash, StoredImagesHoldTheClosedFormTruth) {
    start(R"({"receivers": {"R1": {"psat_slope_db_per_ghz": -0.2, "psat_ripple_db": 0.5}},
              "stored": [{"receiver": "R1", "age_days": 0, "records": 3}]})");
    std::string reply = scpi("DIAG:flasharray? \"RCVRCHAR\",\"R1\"");
    std::vector<std::uint16_t> words;
    for (std::size_t pos = 1; pos < reply.size();) {
        std::size_t comma = reply.find(',', pos);
        words.push_back(static_cast<std::uint16_t>(std::stoul(reply.substr(pos, comma - pos))));
        pos = comma == std::string::npos ? reply.size() : comma + 1;
    }
    ASSERT_EQ(11u + 3 * 28, words.size());
    EXPECT_EQ(1, words[0]);
    EXPECT_EQ(3, words[1] | (words[2] << 16));
    EXPECT_EQ(4, words[3]);
    EXPECT_EQ(('1' << 8) | 'R', words[4]);
    EXPECT_EQ(0x0000, words[5]);  // 25.0f is 00 00 C8 41
    EXPECT_EQ(0x41C8, words[6]);
    auto floatAt = [&](std::size_t i) {
        std::uint32_t bits = words[i] | (static_cast<std::uint32_t>(words[i + 1]) << 16);
        float f;
        std::memcpy(&f, &bits, 4);
        return f;
    };
    EXPECT_FLOAT_EQ(30.0f, floatAt(9));
    auto doubleAt = [&](std::size_t i) {
        std::uint64_t bits = 0;
        for (std::size_t w = 0; w < 4; ++w) {
            bits |= static_cast<std::uint64_t>(words[i + w]) << (16 * w);
        }
        double d;
        std::memcpy(&d, &bits, 8);
        return d;
    };
    // Records from 10 MHz to 26.5 GHz; at each level the reading is the input power at
    // compression, at the record's own frequency, minus the level.
    const auto& r1 = m_analyzer->scenario().receiver("R1");
    const double frequencies[] = {10e6, (10e6 + 26.5e9) / 2, 26.5e9};
    const double levels[] = {0.05, 0.1, 0.2, 0.5};
    for (std::size_t r = 0; r < 3; ++r) {
        const std::size_t at = 11 + 28 * r;
        EXPECT_DOUBLE_EQ(frequencies[r], doubleAt(at)) << "record " << r;
        for (std::size_t k = 0; k < 4; ++k) {
            const double x = levels[k];
            EXPECT_NEAR(sim::compressionInputPowerDbm(r1, x, frequencies[r]) - x,
                        floatAt(at + 4 + 6 * k), 1e-4)
                << "record " << r << ", level " << x;
            EXPECT_FLOAT_EQ(static_cast<float>(-x), floatAt(at + 6 + 6 * k));
            EXPECT_FLOAT_EQ(static_cast<float>(-r1.amPmDegPerDb * x), floatAt(at + 8 + 6 * k));
        }
    }
    // The scenario's slope shows: the last record reads about 5 dB below the first.
    EXPECT_LT(floatAt(11 + 56 + 4), floatAt(11 + 4) - 4.0f);
}

TEST_F(Flash, FlashSurvivesRestartAndTheNextRunButVolatileStateDoesNot) {
    start(R"({"stored": [{"receiver": "B", "age_days": 2, "records": 1}]})");
    scpi(flashWrite("A", {5, 6}));
    scpi("DIAG:FLASH:file:erase \"RCVRCHAR\",\"B\"");
    EXPECT_EQ("0,\"No error\"", nextError());
    scpi("DIAG:FLASH:file:erase \"RCVRCHAR\",\"B\"");
    EXPECT_EQ("-256,\"File name not found; RCVRCHAR\\B\"", nextError());
    scpi("SENS:AVER:COUN 9");
    scpi("BAD");
    m_analyzer->restartApplication();
    EXPECT_EQ(
        "simulated analyzer: SCPI parse on an object of an application that has since been "
        "restarted",
        testsupport::errorOf([&] { scpi("*IDN?"); }));
    connect();
    EXPECT_EQ("0,\"No error\"", nextError());
    EXPECT_EQ("1", scpi("SENS:AVER:COUN?"));
    EXPECT_EQ(",5,6", scpi("DIAG:flasharray? \"RCVRCHAR\",\"A\""));
    // A new run on the same state directory: the flash is there, the erased seed stays erased.
    m_analyzer.reset();
    start(R"({"stored": [{"receiver": "B", "age_days": 2, "records": 1}]})");
    EXPECT_EQ(",5,6", scpi("DIAG:flasharray? \"RCVRCHAR\",\"A\""));
    EXPECT_EQ(std::string::npos, scpi("DIAG:FLASH:CAT?").find("RCVRCHAR\\B"));
}

TEST_F(Flash, LargeWriteIsTakenWhole) {
    start();
    std::string command = "DIAG:FLASHARRAY \"RcvrChar\",\"A\"";
    const std::size_t words = 11 + 28 * 100000;
    command.reserve(words * 7 + 40);
    for (std::size_t i = 0; i < words; ++i) {
        command += ", " + std::to_string(i % 65536);
    }
    scpi(command);
    EXPECT_EQ("0,\"No error\"", nextError());
    std::string back = scpi("DIAG:flasharray? \"RCVRCHAR\",\"A\"");
    EXPECT_EQ(words, static_cast<std::size_t>(std::count(back.begin(), back.end(), ',')));
    // The transcript keeps the write abbreviated.
    auto lines = m_analyzer->transcript();
    ASSERT_GE(lines.size(), 2u);
    EXPECT_EQ(0u, lines[1].rfind("> DIAG:FLASHARRAY \"RcvrChar\",\"A\", 0, 1, 2", 0));
    EXPECT_NE(std::string::npos,
              lines[1].find("... [" + std::to_string(command.size()) + " characters]"));
}

class MillimetreWave : public SimFixture {
  protected:
    void SetUp() override {
        start(R"({"idn": "Velquor Technologies,T3872B,MY2,A.13.55.06",
                  "mmwave_catalog": "Default,T3951A Broadband",
                  "mmwave_active": "T3951A Broadband",
                  "stored": [{"receiver": "R2", "age_days": 1, "records": 100}]})");
        m_paths = std::make_unique<platform::DrivePathMap>(m_work.path());
        m_paths->mapDrive('C', m_analyzer->driveRoot());
        m_runner = std::make_unique<sim::SimProcessRunner>(*m_analyzer, *m_paths);
    }
    static std::string dataFile(int port, const char* file) {
        return "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\T3951A "
               "Broadband\\Port " +
               std::to_string(port) + "\\Factory Cal Data\\" + file;
    }
    testsupport::TempDir m_work;
    std::unique_ptr<platform::DrivePathMap> m_paths;
    std::unique_ptr<sim::SimProcessRunner> m_runner;
};

TEST_F(MillimetreWave, StoredCalibrationsArePerPortDataFilesListedByDir) {
    EXPECT_EQ("\"Default,T3951A Broadband\"", scpi("SYST:CONF:MWAV:CONF:CAT?"));
    EXPECT_EQ("\"T3951A Broadband\"", scpi("SYST:CONF:MWAV:CONF:ACT?"));
    std::string path = dataFile(2, "RcvrCharRef.dat");
    EXPECT_EQ(0, m_runner->runCommand("dir /-C \"" + path + "\" > fileInfo.txt"));
    std::string listing = testsupport::readFile(m_work / "fileInfo.txt");
    std::string line;
    for (const auto& candidate : simtest::splitLines(listing)) {
        if (line.empty() && candidate.find("RcvrCharRef.dat") != std::string::npos) {
            line = candidate;
        }
    }
    auto f = fields(line);
    ASSERT_GE(f.size(), 5u) << listing;
    EXPECT_EQ(todayText(1), f[0]);
    EXPECT_EQ(std::to_string(22 + 56 * 100), f[3]);
    EXPECT_EQ("RcvrCharRef.dat", f[4].substr(0, 15));
    EXPECT_NE(std::string::npos, listing.find(" Directory of C:\\ProgramData"));

    EXPECT_EQ(1, m_runner->runCommand("dir /-C \"" + dataFile(1, "RcvrCharRef.dat") +
                                      "\" > fileInfo.txt"));
    listing = testsupport::readFile(m_work / "fileInfo.txt");
    EXPECT_NE(std::string::npos, listing.find("File Not Found"));
    EXPECT_EQ(std::string::npos, listing.find("RcvrCharRef.dat"));
}

TEST_F(MillimetreWave, PushTakesThePortFilesIntoFlashAndDelRemovesThem) {
    EXPECT_EQ(std::string::npos, scpi("DIAG:FLASH:CAT?").find("R2"));
    scpi("diag:mm:data:push 2,0");
    EXPECT_EQ("0,\"No error\"", nextError());
    EXPECT_NE(std::string::npos, scpi("DIAG:FLASH:CAT?").find("RCVRCHAR\\R2"));

    testsupport::writeFile(m_paths->toLocal(dataFile(3, "RcvrCharTest.dat")),
                           std::string("\x01\x00\x02\x00", 4));
    scpi("diag:mm:data:push 3,0");
    EXPECT_EQ(",1,2", scpi("DIAG:flasharray? \"RCVRCHAR\",\"C\""));

    EXPECT_EQ(0, m_runner->runCommand("del \"" + dataFile(2, "RcvrCharRef.dat") + "\""));
    EXPECT_EQ(1, m_runner->runCommand("del \"" + dataFile(2, "RcvrCharRef.dat") + "\""));
    scpi("diag:mm:data:push 2,0");
    EXPECT_EQ(std::string::npos, scpi("DIAG:FLASH:CAT?").find("RCVRCHAR\\R2"));

    scpi("diag:mm:data:push 5,0");
    EXPECT_EQ("-222,\"Data out of range\"", nextError());
    std::filesystem::remove_all(m_paths->toLocal(dataFile(4, "x")).parent_path());
    scpi("diag:mm:data:push 4,0");
    EXPECT_EQ(0u, nextError().rfind("-256,\"File name not found; ", 0));
}

TEST_F(MillimetreWave, RestartProgramRestartsOnlyFromTheApplicationDirectory) {
    scpi("SENS:AVER:COUN 3");
    EXPECT_EQ(0, m_runner->runProgram(
                     "\"C:\\Program Files (x86)\\Velquor\\Network Analyzer\\restartapp.exe\""));
    EXPECT_THROW(scpi("*IDN?"), std::string);
    connect();
    EXPECT_EQ("1", scpi("SENS:AVER:COUN?"));
    EXPECT_EQ(
        "The system cannot find the file specified: C:\\Elsewhere\\restartapp.exe",
        testsupport::errorOf([&] { m_runner->runProgram("\"C:\\Elsewhere\\restartapp.exe\""); }));
    EXPECT_EQ(9009, m_runner->runCommand("format C:"));
}

}  // namespace
