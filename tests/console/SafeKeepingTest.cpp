// What the dialog keeps when it erases, replaces or fails to write: backups, the exit question,
// reported write failures and the earlier attempts' raw files.

#include <gtest/gtest.h>

#include "ConsoleRun.h"
#include "app/CTarvexApp.h"
#include "scpi/Device.h"
#include "storage/BackupManifest.h"
#include "storage/RcvrCharImage.h"

using testsupport::ConsoleRun;
using testsupport::readFile;

namespace {

// R1 and A stored with the current calibration points.
std::string storedR1AndA() {
    const std::string records = std::to_string(testsupport::sampleRecordCount());
    return R"({"options": "010,080", "stored": [{"receiver": "R1", "age_days": 1, "records": )" +
           records + R"(}, {"receiver": "A", "age_days": 1, "records": )" + records + "}]}";
}

// The only folder in dir, or an empty path.
std::filesystem::path onlyFolderIn(const std::filesystem::path& dir) {
    std::vector<std::filesystem::path> folders;
    std::error_code ec;
    for (const auto& item : std::filesystem::directory_iterator(dir, ec)) {
        folders.push_back(item.path());
    }
    return folders.size() == 1 ? folders[0] : std::filesystem::path();
}

// What the simulated analyzer's flash holds for the name, asked over its own SCPI.
std::vector<std::uint16_t> flashWords(ConsoleRun& run, const std::string& name) {
    auto session = run.simulator().scpiDevice()->openSession();
    return storage::RcvrCharImage::fromFlashReply(
               session->execute("DIAG:FLASHARRAY? \"RcvrChar\",\"" + name + "\""))
        .words();
}

const std::string kOperator =
    "Connections = OK\n"
    "Reload now? = Yes\n"
    "Delete previous calibrations? = Yes\n"
    "Exit without finishing cal? = Yes\n";

}  // namespace

TEST(DialogBackups, ErasedAndNotStoredAgainIsNamedAtExitWithItsBackup) {
    ConsoleRun run(storedR1AndA());
    const auto storedA = flashWords(run, "A");
    ASSERT_GT(storedA.size(), 11u);
    // Yes to the erase, then No to the reload: A is erased and never characterized again.
    ASSERT_EQ(run.run("clear\nselect A\nrun\n",
                      "Delete previous calibrations? = Yes\nReload now? = No\n"
                      "Exit without finishing cal? = Yes\n"),
              0)
        << run.err();
    const auto folder = onlyFolderIn(run.dir() / "backups");
    ASSERT_FALSE(folder.empty());
    EXPECT_TRUE(run.inOrder({
        "[Delete previous calibrations?] ",
        "Backup of the characterizations to be erased saved in " + folder.string() + "\n",
        "Erased and not characterized again: A; its backup is in " + folder.string() + "\n",
        "[Exit without finishing cal?] You have not successfully calibrated receiver(s): B, C, "
        "D, R2, R3, R4\nErased and not characterized again, so the analyzer now holds no "
        "characterization for receiver(s): A (the log says where their backups are)\nDo you "
        "really want to exit now? => Yes\n",
    })) << run.out();
    EXPECT_EQ(run.transcriptMatching("erase").size(), 1u);
    EXPECT_EQ(storage::RcvrCharImage::fromBytes(readFile(folder / "RcvrChar_A.dat")).words(),
              storedA);
    const auto manifest = storage::readManifest(folder);
    ASSERT_EQ(manifest.entries.size(), 1u);
    EXPECT_EQ(manifest.entries[0].receiver, "A");
    EXPECT_EQ(manifest.entries[0].reason, "erase");
}

TEST(DialogBackups, ABackupThatCannotBeWrittenStopsTheEraseWithAnErrorBox) {
    ConsoleRun run(storedR1AndA());
    testsupport::writeFile(run.dir() / "backups", "");
    ASSERT_EQ(run.run("clear\nselect A\nrun\n", kOperator + "Error = OK\n"), 0) << run.err();
    EXPECT_TRUE(run.inOrder({
        "[Delete previous calibrations?] ",
        "[Error] No backup could be saved of the characterization of A: Cannot create the "
        "backup folder " +
            (run.dir() / "backups").string(),
        ": Not a directory. Nothing has been erased. => OK\n",
    })) << run.out();
    EXPECT_TRUE(run.transcriptMatching("erase").empty());
    EXPECT_FALSE(run.has("Cal Started"));
    EXPECT_GT(flashWords(run, "A").size(), 11u);
}

TEST(ThreadedDialogBackups, AStoreOverAStoredCharacterizationBacksItUpFirst) {
    ConsoleRun run(storedR1AndA());
    const auto storedR1 = flashWords(run, "R1");
    ASSERT_GT(storedR1.size(), 11u);
    ASSERT_EQ(run.run("clear\nselect R1\nrun\nwait\n", kOperator), 0) << run.err();
    EXPECT_TRUE(run.has("Cal Complete\n")) << run.out();
    const auto folder = onlyFolderIn(run.dir() / "backups");
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(storage::RcvrCharImage::fromBytes(readFile(folder / "RcvrChar_R1.dat")).words(),
              storedR1);
    EXPECT_EQ(storage::readManifest(folder).entries.at(0).reason, "overwrite");
    EXPECT_NE(flashWords(run, "R1"), storedR1);
}

TEST(ThreadedDialogWriteFailures, UnwritableRawFilesAreReportedAndEndWithStatusThree) {
    ConsoleRun run;
    testsupport::writeFile(run.dir() / "RcvrChar_AllMeasuredData_R1.csv", "earlier");
    std::filesystem::create_directory(run.dir() / "RcvrChar_AllMeasuredData_R1.csv.partial");
    std::filesystem::create_directory(run.dir() / "rcvrCharRaw_R1.txt.partial");
    ASSERT_EQ(run.run("clear\nselect R1\nrun\nwait\n", kOperator + "Error = OK\n"),
              app::CTarvexApp::exitRunFailed)
        << run.err();
    const std::string csv = (run.dir() / "RcvrChar_AllMeasuredData_R1.csv").string();
    const std::string raw = (run.dir() / "rcvrCharRaw_R1.txt").string();
    EXPECT_TRUE(run.inOrder({
        "Writing Cal File\n",
        "File not written: Cannot write the raw measured data RcvrChar_AllMeasuredData_R1.csv (" +
            csv + "): Is a directory; any earlier file of that name is left as it was\n",
        "[Error] Cannot write the raw measured data RcvrChar_AllMeasuredData_R1.csv (" + csv +
            "): Is a directory; any earlier file of that name is left as it was\n\nThe "
            "characterization stored in the analyzer is not affected. => OK\n",
        "[Error] Cannot write the raw result file rcvrCharRaw_R1.txt (" + raw + "): Is a directory",
        "Cal Complete\n",
    })) << run.out();
    // The characterization is stored all the same; the earlier CSV is kept whole.
    EXPECT_EQ(run.transcriptMatching("DIAG:FLASHARRAY \"RcvrChar\",\"R1\"").size(), 1u);
    EXPECT_FALSE(std::filesystem::exists(run.dir() / "RcvrChar_AllMeasuredData_R1.csv"));
    const auto history = onlyFolderIn(run.dir() / "history");
    EXPECT_EQ(readFile(history / "RcvrChar_AllMeasuredData_R1.1.csv"), "earlier");
}

TEST(DialogWriteFailures, AnExportThatCannotBeWrittenIsReportedAndEndsWithStatusThree) {
    ConsoleRun run(storedR1AndA());
    testsupport::writeFile(run.dir() / "RcvrChar_A_Exported.txt", "earlier export");
    std::filesystem::create_directory(run.dir() / "RcvrChar_A_Exported.txt.partial");
    ASSERT_EQ(run.run("export\n", "Export calibration? = Yes\nError = OK\n"),
              app::CTarvexApp::exitRunFailed)
        << run.err();
    EXPECT_TRUE(run.inOrder({"[Export calibration?] ",
                             "File not written: Cannot write the export "
                             "file RcvrChar_A_Exported.txt (",
                             "[Error] Cannot write the export file RcvrChar_A_Exported.txt ("}))
        << run.out();
    EXPECT_EQ(readFile(run.dir() / "RcvrChar_A_Exported.txt"), "earlier export");
}

TEST(ThreadedDialogHistory, ARetestKeepsTheFailedAttemptsRawFilesAndTheLastLog) {
    ConsoleRun run(R"({"options": "010,080", "faults": {"bad_data": {"R1": 1}}})");
    testsupport::writeFile(run.dir() / "FlashCommands.txt", "the previous dialog's log\r\n");
    ASSERT_EQ(run.run("clear\nselect R1\nrun\nwait\n",
                      kOperator + "Characterization data issue! = Retest\nPlease Note = OK\n"),
              0)
        << run.err();
    ASSERT_TRUE(run.inOrder({"Cal will be repeated\n", "Started Cal R1\n", "Cal Complete\n"}));
    const auto history = onlyFolderIn(run.dir() / "history");
    ASSERT_FALSE(history.empty());
    const std::string failed = readFile(history / "rcvrCharRaw_R1.1.txt");
    EXPECT_NE(failed.find("FAILED BAD CONNECTION CRITERIA"), std::string::npos);
    EXPECT_EQ(readFile(run.dir() / "rcvrCharRaw_R1.txt").find("FAILED"), std::string::npos);
    EXPECT_NE(readFile(history / "RcvrChar_AllMeasuredData_R1.1.csv"),
              readFile(run.dir() / "RcvrChar_AllMeasuredData_R1.csv"));
    EXPECT_FALSE(std::filesystem::exists(history / "rcvrCharRaw_R1.2.txt"));
    EXPECT_EQ(readFile(history / "FlashCommands.1.txt"), "the previous dialog's log\r\n");
}
