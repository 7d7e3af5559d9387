#include <gtest/gtest.h>

#include "RunRcvrchar.h"

namespace {

using clitest::CommandRun;
using clitest::runRcvrchar;

const char* kMillimetreWave =
    R"("idn": "Velquor Technologies,T3872B,MY00000001,A.13.55.06",
       "mmwave_catalog": "Default,T3951A Broadband", "mmwave_active": "T3951A Broadband")";

std::string portFile(int port, const std::string& file) {
    return "'analyzer-sim/C/ProgramData/Velquor/Network Analyzer/Configurations/T3951A "
           "Broadband/Port " +
           std::to_string(port) + "/Factory Cal Data/" + file + "'";
}

}  // namespace

TEST(ExportCommand, FlashAnalyzerExportsEveryStoredCharacterizationWithoutAsking) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "s.json", R"({"stored": [
        {"receiver": "B", "age_days": 30, "records": 3},
        {"receiver": "R1", "age_days": 1, "records": 2}]})");
    CommandRun run = runRcvrchar(dir, "export --analyzer sim:s.json --clock virtual");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "RcvrChar_R1_Exported.txt\nRcvrChar_B_Exported.txt\n");
    EXPECT_EQ(run.err, "");
    std::string b = testsupport::readFile(dir / "RcvrChar_B_Exported.txt");
    EXPECT_EQ(b.rfind("1\nB\n25\n-3\n30\n10000000, (", 0), 0u) << b;
    EXPECT_EQ(std::count(b.begin(), b.end(), '\n'), 4 + 3);
    EXPECT_TRUE(std::filesystem::is_directory(dir / "analyzer-sim"));
}

TEST(ExportCommand, ShortImageEndsTheExportAndDecodeRoundTripsTheDataFile) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "m.json", "{" + std::string(kMillimetreWave) + R"(, "stored": [
        {"receiver": "R2", "age_days": 1, "records": 2},
        {"receiver": "C", "age_days": 1, "words": 30},
        {"receiver": "D", "age_days": 1, "records": 1}]})");
    CommandRun run = runRcvrchar(dir, "export --analyzer sim:m.json --clock virtual");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "RcvrChar_R2_Exported.txt\nRcvrChar_C_Exported.txt\n");
    EXPECT_EQ(run.err,
              "The export ended at receiver C: the header announces 1 records but the image "
              "holds 0 complete records (30 words)\n");
    EXPECT_EQ(testsupport::readFile(dir / "RcvrChar_C_Exported.txt"), "1\nC\n25\n-3\n30");
    EXPECT_FALSE(std::filesystem::exists(dir / "RcvrChar_D_Exported.txt"));

    CommandRun decoded = runRcvrchar(dir, "decode " + portFile(2, "RcvrCharRef.dat"));
    ASSERT_EQ(decoded.status, 0) << decoded.err;
    EXPECT_EQ(decoded.out, testsupport::readFile(dir / "RcvrChar_R2_Exported.txt"));

    CommandRun shortFile = runRcvrchar(dir, "decode " + portFile(3, "RcvrCharTest.dat"));
    EXPECT_EQ(shortFile.status, 1);
    EXPECT_EQ(shortFile.out, "");
    EXPECT_NE(shortFile.err.find("RcvrCharTest.dat is not a characterization data file: the "
                                 "header announces 1 records but the image holds 0 complete "
                                 "records (30 words)\n"),
              std::string::npos)
        << shortFile.err;
}

TEST(ExportCommand, NothingStoredAndStateDirectoryOption) {
    testsupport::TempDir dir;
    std::filesystem::create_directory(dir / "work");
    CommandRun run = runRcvrchar(dir, "export --workdir work --sim-state state --clock virtual");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "");
    EXPECT_EQ(run.err, "The analyzer holds no characterization\n");
    EXPECT_TRUE(std::filesystem::is_directory(dir / "state" / "C"));
    EXPECT_FALSE(std::filesystem::exists(dir / "work" / "analyzer-sim"));
}

TEST(ExportCommand, UnusableOptionsAreNamed) {
    testsupport::TempDir dir;
    CommandRun backEnd = runRcvrchar(dir, "export --analyzer gpib:7");
    EXPECT_EQ(backEnd.status, 1);
    EXPECT_EQ(backEnd.err.rfind(
                  "--analyzer must be sim, sim:SCENARIO.json or a LAN resource string (", 0),
              0u)
        << backEnd.err;
    EXPECT_NE(backEnd.err.find("TCPIP[n]::HOST[::PORT]::SOCKET"), std::string::npos);
    EXPECT_NE(backEnd.err.find("not \"gpib:7\"\n"), std::string::npos) << backEnd.err;
    CommandRun workdir = runRcvrchar(dir, "export --workdir absent");
    EXPECT_EQ(workdir.status, 1);
    EXPECT_EQ(workdir.err, "--workdir absent is not a directory\n");
    CommandRun clock = runRcvrchar(dir, "export --clock fast");
    EXPECT_NE(clock.status, 0);
    EXPECT_NE(clock.err.find("--clock"), std::string::npos) << clock.err;
    EXPECT_FALSE(std::filesystem::exists(dir / "analyzer-sim"));
}

TEST(DecodeCommand, MalformedFilesGiveAClearErrorAndStatusOne) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "odd.dat", std::string(23, '\0'));
    testsupport::writeFile(dir / "short.dat", std::string(20, '\0'));
    // A header announcing 0 records with 9 levels.
    std::string levels = std::string("\x01\x00\x00\x00\x00\x00\x09\x00", 8) + std::string(14, '\0');
    testsupport::writeFile(dir / "levels.dat", levels);
    struct Case {
        const char* file;
        const char* error;
    };
    for (const Case& c :
         {Case{"absent.dat", "Cannot open absent.dat: No such file or directory\n"},
          Case{"odd.dat",
               "odd.dat is not a characterization data file: it holds an odd number of bytes "
               "(23)\n"},
          Case{"short.dat",
               "short.dat is not a characterization data file: the image holds 10 words, fewer "
               "than the 11 of its header\n"},
          Case{"levels.dat",
               "levels.dat is not a characterization data file: the header announces 9 "
               "compression levels, more than the 4 a record holds\n"}}) {
        CommandRun run = runRcvrchar(dir, std::string("decode ") + c.file);
        EXPECT_EQ(run.status, 1) << c.file;
        EXPECT_EQ(run.out, "") << c.file;
        EXPECT_EQ(run.err, c.error);
    }
}

TEST(DecodeCommand, HeaderOnlyImagePrintsItsFiveLines) {
    testsupport::TempDir dir;
    // Word 0 = 1, 0 records, 4 levels, "A", 25.0, 1.5 dB loss, 10 dB.
    std::string bytes(
        "\x01\x00\x00\x00\x00\x00\x04\x00\x41\x00"
        "\x00\x00\xC8\x41\x00\x00\xC0\x3F\x00\x00\x20\x41",
        22);
    testsupport::writeFile(dir / "RcvrCharTest.dat", bytes);
    CommandRun run = runRcvrchar(dir, "decode RcvrCharTest.dat");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.out, "1\nA\n25\n1.5\n10");
}
