#include <gtest/gtest.h>

#include "RunRcvrchar.h"

namespace {

using clitest::CommandRun;

using clitest::runRcvrchar;

std::string scenario(const std::string& name) {
    return "'sim:" RCVRCHAR_SOURCE_DIR "/data/scenarios/" + name + "'";
}

class Dialog : public ::testing::Test {
  protected:
    void SetUp() override {
        std::filesystem::copy_file(testsupport::sampleConfiguration(), m_dir / "RcvrChar.dat");
    }
    testsupport::TempDir m_dir;
};

}  // namespace

TEST_F(Dialog, HelpExplainsEveryOptionWithAnExample) {
    const CommandRun run = runRcvrchar(m_dir, "--help");
    ASSERT_EQ(run.status, 0) << run.err;
    for (const char* option : {"--workdir", "--analyzer", "--sim-state", "--clock", "--script",
                               "--answers", "--yes", "--trace"}) {
        EXPECT_NE(run.out.find(option), std::string::npos) << option;
    }
    EXPECT_NE(run.out.find("Example:"), std::string::npos);
    EXPECT_NE(run.out.find("[CAPTION] TEXT => ANSWER"), std::string::npos);
}

TEST_F(Dialog, ScriptFromStandardInputRunsAndLeavesTheRunFilesInTheWorkingDirectory) {
    const CommandRun run = runRcvrchar(
        m_dir, "--workdir . --analyzer " + scenario("default.json") + " --yes --trace trace.txt",
        "clear\nselect R1\nrun\nwait\n");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_NE(run.out.find("Started Cal R1\n"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("All requested cals complete, click Exit to apply.\n"),
              std::string::npos);
    EXPECT_NE(run.out.find("[Restart] Restarting TVA Application\n"), std::string::npos);
    EXPECT_NE(run.err.find("rcvrchar: protocol waits counted by the virtual clock: "),
              std::string::npos);
    EXPECT_TRUE(std::filesystem::exists(m_dir / "FlashCommands.txt"));
    EXPECT_TRUE(std::filesystem::exists(m_dir / "RcvrChar_AllMeasuredData_R1.csv"));
    EXPECT_TRUE(std::filesystem::exists(m_dir / "rcvrCharRaw_R1.txt"));
    EXPECT_NE(testsupport::readFile(m_dir / "trace.txt").find("DIAG:FLASHARRAY"),
              std::string::npos);
    EXPECT_TRUE(std::filesystem::is_directory(m_dir / "analyzer-sim"));
}

TEST_F(Dialog, StatusFourForAnUnansweredBoxAndOneForAnErrorBox) {
    testsupport::writeFile(m_dir / "script.txt", "clear\nselect R1\nrun\nwait\n");
    testsupport::writeFile(m_dir / "answers.txt", "Reload now? = Yes\n");
    const CommandRun unanswered =
        runRcvrchar(m_dir, "--analyzer " + scenario("default.json") +
                               " --script script.txt --answers answers.txt");
    EXPECT_EQ(unanswered.status, 4);
    EXPECT_NE(unanswered.err.find("rcvrchar: no answer for the box [Connections] Connect cable to "
                                  "PORT 1.\n"),
              std::string::npos)
        << unanswered.err;

    std::filesystem::remove(m_dir / "RcvrChar.dat");
    const CommandRun missing =
        runRcvrchar(m_dir, "--analyzer " + scenario("default.json") + " --yes", "run\n");
    EXPECT_EQ(missing.status, 1);
    EXPECT_EQ(missing.out,
              "Analyzer: Velquor Technologies,T3872A,MY00000001,A.13.55.06\n"
              "[Error] CNAData::ReadSequence Can't open file RcvrChar.dat => OK\n");
}

TEST_F(Dialog, BadCommandLinesAreRefusedWithTheReason) {
    const CommandRun both = runRcvrchar(m_dir, "--yes --answers a.txt");
    EXPECT_NE(both.status, 0);
    EXPECT_NE(both.err.find("--answers excludes --yes"), std::string::npos) << both.err;

    const CommandRun noFile = runRcvrchar(m_dir, "--script missing.txt --yes");
    EXPECT_EQ(noFile.status, 1);
    EXPECT_EQ(noFile.err, "Cannot read the operator script \"missing.txt\"\n");

    testsupport::writeFile(m_dir / "bad.txt", "run\ndance\n");
    const CommandRun badScript = runRcvrchar(m_dir, "--script bad.txt --yes");
    EXPECT_EQ(badScript.status, 1);
    EXPECT_EQ(badScript.err,
              "script line 2: unknown action \"dance\" (selectall, clear, select, run, wait, "
              "export, about, abort, exit, close, on)\n");
}
