#include <gtest/gtest.h>
#include <unistd.h>

#include "RunRcvrchar.h"
#include "platform/FolderLock.h"

namespace {

using clitest::CommandRun;
using clitest::runRcvrchar;

// A stored with the sample configuration's points, R1 old-sized; serial MY00000001 unless
// another is given.
std::string scenario(const std::string& serial = "MY00000001") {
    return R"({"idn": "Velquor Technologies,T3872A,)" + serial + R"(,A.13.55.06",
               "options": "010,080",
               "stored": [{"receiver": "A", "age_days": 2, "records": 4}]})";
}

class BackupCommands : public ::testing::Test {
  protected:
    void SetUp() override {
        std::filesystem::copy_file(testsupport::sampleConfiguration(), m_dir / "RcvrChar.dat");
        testsupport::writeFile(m_dir / "s.json", scenario());
        testsupport::writeFile(m_dir / "other.json", scenario("MY99999999"));
    }
    // The dialog erases A (old-sized) and exits without characterizing it again.
    std::filesystem::path eraseA() {
        testsupport::writeFile(m_dir / "answers.txt",
                               "Delete previous calibrations? = Yes\nReload now? = No\n"
                               "Cal selections adjusted = OK\nExit without finishing cal? = Yes\n");
        const CommandRun run = runRcvrchar(m_dir, "--analyzer sim:s.json --answers answers.txt",
                                           "clear\nselect R1\nrun\n");
        EXPECT_EQ(run.status, 0) << run.out << run.err;
        std::vector<std::filesystem::path> folders;
        for (const auto& item : std::filesystem::directory_iterator(m_dir / "backups")) {
            folders.push_back(item.path());
        }
        EXPECT_EQ(folders.size(), 1u);
        return folders.empty() ? std::filesystem::path() : folders[0];
    }
    std::string exportedA() {
        const CommandRun run = runRcvrchar(m_dir, "export --analyzer sim:s.json");
        EXPECT_EQ(run.status, 0) << run.err;
        return run.out.find("RcvrChar_A_Exported.txt") == std::string::npos
                   ? ""
                   : testsupport::readFile(m_dir / "RcvrChar_A_Exported.txt");
    }
    testsupport::TempDir m_dir;
};

}  // namespace

TEST_F(BackupCommands, AnErasedCharacterizationIsListedDecodedAndRestored) {
    const std::string before = exportedA();
    ASSERT_FALSE(before.empty());
    const auto folder = eraseA();
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(exportedA(), "");

    const CommandRun list = runRcvrchar(m_dir, "backups");
    ASSERT_EQ(list.status, 0) << list.err;
    EXPECT_EQ(
        list.out.rfind(folder.filename().string() + "  serial MY00000001  T3872A  receivers A\n"
                                                    "  A: read ",
                       0),
        0u)
        << list.out;
    EXPECT_NE(list.out.find(" before erase, stored "), std::string::npos) << list.out;

    const CommandRun decoded =
        runRcvrchar(m_dir, "decode '" + (folder / "RcvrChar_A.dat").string() + "'");
    ASSERT_EQ(decoded.status, 0) << decoded.err;
    EXPECT_EQ(decoded.out, before);
    EXPECT_EQ(testsupport::readFile(folder / "RcvrChar_A_Exported.txt"), before);

    // Another instrument's backup is refused unless forced.
    const std::string name = folder.filename().string();
    const CommandRun refused = runRcvrchar(m_dir, "restore " + name + " --analyzer sim:other.json");
    EXPECT_EQ(refused.status, 1);
    EXPECT_NE(refused.err.find("was read from the instrument with serial number MY00000001, this "
                               "analyzer's is MY99999999; nothing restored (--force restores it "
                               "anyway)"),
              std::string::npos)
        << refused.err;

    const CommandRun restored = runRcvrchar(m_dir, "restore " + name + " --analyzer sim:s.json");
    ASSERT_EQ(restored.status, 0) << restored.out << restored.err;
    EXPECT_EQ(restored.out.rfind("A: restored from " + (folder / "RcvrChar_A.dat").string(), 0), 0u)
        << restored.out;
    EXPECT_NE(restored.out.find("read back equal\n"), std::string::npos);
    EXPECT_EQ(exportedA(), before);
    EXPECT_NE(testsupport::readFile(m_dir / "FlashCommands.txt").find("diag:fcal:load"),
              std::string::npos);
}

TEST_F(BackupCommands, RestoreReportsEachReceiverAndFailsOnATamperedOne) {
    const auto folder = eraseA();
    ASSERT_FALSE(folder.empty());
    testsupport::writeFile(folder / "RcvrChar_A.dat", "not what was saved");
    const CommandRun unknown =
        runRcvrchar(m_dir, "restore '" + folder.string() + "' --receiver B --analyzer sim:s.json");
    EXPECT_EQ(unknown.status, 1);
    EXPECT_EQ(unknown.err, "The backup holds no characterization of receiver B; it holds A\n");
    const CommandRun tampered =
        runRcvrchar(m_dir, "restore '" + folder.string() + "' --receiver A --analyzer sim:s.json");
    EXPECT_EQ(tampered.status, 1);
    EXPECT_EQ(tampered.out.rfind("A: NOT restored: the backup's data file ", 0), 0u)
        << tampered.out;
    EXPECT_EQ(tampered.err, "1 of 1 receivers not restored\n");
    EXPECT_EQ(exportedA(), "");
}

TEST_F(BackupCommands, AFolderInUseIsRefusedAndAStaleLockBlocksNothing) {
    {
        platform::FolderLock held(m_dir.path(), "the dialog");
        const CommandRun refused = runRcvrchar(m_dir, "export --analyzer sim:s.json");
        EXPECT_EQ(refused.status, 1);
        EXPECT_EQ(refused.err, "The folder " + std::filesystem::canonical(m_dir.path()).string() +
                                   " is in use by another rcvrchar (the dialog, process " +
                                   std::to_string(::getpid()) +
                                   "); wait until it has ended, or use another folder\n");
        EXPECT_FALSE(std::filesystem::exists(m_dir / "RcvrChar_A_Exported.txt"));
        const CommandRun dialog = runRcvrchar(m_dir, "--analyzer sim:s.json --yes", "exit\n");
        EXPECT_EQ(dialog.status, 1);
        EXPECT_NE(dialog.err.find("is in use by another rcvrchar"), std::string::npos);
    }
    {
        // The simulator's state is locked on its own, whichever folder works with it.
        platform::FolderLock held(m_dir / "analyzer-sim", "the dialog");
        testsupport::TempDir other;
        const CommandRun refused =
            runRcvrchar(other, "export --analyzer 'sim:" + (m_dir / "s.json").string() +
                                   "' --sim-state '" + (m_dir / "analyzer-sim").string() + "'");
        EXPECT_EQ(refused.status, 1);
        EXPECT_NE(refused.err.find("analyzer-sim is in use by another rcvrchar"), std::string::npos)
            << refused.err;
    }
    // The lock files stay behind, as after a crash; they hold nobody up.
    EXPECT_TRUE(std::filesystem::exists(m_dir / platform::FolderLock::kFileName));
    EXPECT_FALSE(exportedA().empty());
}
