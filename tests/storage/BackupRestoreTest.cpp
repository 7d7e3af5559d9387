#include <gtest/gtest.h>

#include <sstream>

#include "ErrorOf.h"
#include "SimBench.h"
#include "platform/Sha256.h"
#include "storage/BackupManifest.h"
#include "storage/ExportText.h"
#include "storage/RestoreBackup.h"
#include "storage/StoredBackups.h"
#include "storage/StoredImage.h"

using storage::BackupReason;
using storage::RcvrCharImage;
using storage::StoredBackups;
using storagetest::SimBench;
using testsupport::readFile;

namespace {

std::string exportTextOf(const RcvrCharImage& image) {
    std::ostringstream text;
    storage::writeExportText(text, image);
    return text.str();
}

}  // namespace

TEST(StoredBackups, FlashBackupHoldsTheImageItsExportAndAManifestThatRestores) {
    SimBench bench(R"("stored": [{"receiver": "R1", "age_days": 2, "records": 3}])");
    const RcvrCharImage stored = storage::readStoredImage(bench.context(), "R1");
    ASSERT_EQ(stored.completeness(), storage::ImageCompleteness::Complete);
    StoredBackups backups(bench.workDir() / "backups", *bench.processes);
    auto context = bench.context();
    context.backups = &backups;

    // R2 holds nothing: it needs no backup and is not in the manifest.
    const auto folder = backups.save(context, {"R1", "R2"}, BackupReason::Erase);
    ASSERT_FALSE(folder.empty());
    EXPECT_EQ(folder.parent_path(), bench.workDir() / "backups");
    EXPECT_TRUE(folder.filename().string().ends_with("-MY00000001")) << folder;
    const std::string bytes = readFile(folder / "RcvrChar_R1.dat");
    EXPECT_EQ(RcvrCharImage::fromBytes(bytes), stored);
    EXPECT_EQ(readFile(folder / "RcvrChar_R1_Exported.txt"), exportTextOf(stored));
    const auto manifest = storage::readManifest(folder);
    EXPECT_EQ(manifest.serial, "MY00000001");
    EXPECT_EQ(manifest.idn, "Velquor Technologies,T3872A,MY00000001,A.13.55.06");
    ASSERT_EQ(manifest.entries.size(), 1u);
    const auto& entry = manifest.entries[0];
    EXPECT_EQ(entry.receiver, "R1");
    EXPECT_EQ(entry.flashName, "R1");
    EXPECT_EQ(entry.bytes, bytes.size());
    EXPECT_EQ(entry.sha256, platform::sha256Hex(bytes));
    EXPECT_EQ(entry.reason, "erase");
    EXPECT_FALSE(entry.catalogDate.empty());
    EXPECT_EQ(backups.latest().at("R1"), folder);

    // Erased, then restored the way a run stores: verified write, load, read back.
    bench.analyzer->sendscpi("DIAG:FLASH:file:erase \"RCVRCHAR\",\"R1\"");
    storage::restoreEntry(context, folder, entry);
    EXPECT_EQ(storage::readStoredImage(bench.context(), "R1"), stored);
    EXPECT_EQ(bench.logLines().back(), "diag:fcal:load");
    // Nothing was stored when the restore began, so it made no backup of its own.
    EXPECT_EQ(backups.latest().at("R1"), folder);
}

TEST(StoredBackups, NothingStoredNeedsNoBackupAndAnUnwritableFolderStopsWithItsReason) {
    SimBench bench(R"("stored": [{"receiver": "A", "age_days": 2, "records": 1}])");
    StoredBackups backups(bench.workDir() / "backups", *bench.processes);
    EXPECT_TRUE(backups.save(bench.context(), {"B"}, BackupReason::Erase).empty());
    EXPECT_FALSE(std::filesystem::exists(bench.workDir() / "backups"));

    testsupport::writeFile(bench.workDir() / "backups", "a file where the folder belongs");
    const std::string text = testsupport::errorOf(
        [&] { backups.save(bench.context(), {"A"}, BackupReason::Overwrite); });
    EXPECT_EQ(text.rfind("No backup could be saved of the characterization of A: Cannot create "
                         "the backup folder " +
                             (bench.workDir() / "backups").string(),
                         0),
              0u)
        << text;
    EXPECT_TRUE(
        text.ends_with(": Not a directory. The stored characterization has not been "
                       "replaced."))
        << text;
    EXPECT_TRUE(backups.latest().empty());
}

TEST(StoredBackups, PortDataFileIsBackedUpAndATamperedBackupIsNotRestored) {
    SimBench bench(std::string(storagetest::kMillimetreWave) +
                   R"(, "stored": [{"receiver": "B", "age_days": 1, "records": 2}])");
    const RcvrCharImage stored = storage::readStoredImage(bench.context(), "B");
    StoredBackups backups(bench.workDir() / "backups", *bench.processes);
    auto context = bench.context();
    context.backups = &backups;
    const auto folder = backups.save(context, {"B"}, BackupReason::Erase);
    ASSERT_FALSE(folder.empty());
    const auto manifest = storage::readManifest(folder);
    ASSERT_EQ(manifest.entries.size(), 1u);
    EXPECT_TRUE(manifest.millimetreWave);
    EXPECT_EQ(manifest.entries[0].portDataPath,
              "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\T3951A Broadband\\"
              "Port 2\\Factory Cal Data\\RcvrCharTest.dat");
    EXPECT_EQ(RcvrCharImage::fromBytes(readFile(folder / "RcvrChar_B.dat")), stored);

    std::string bytes = readFile(folder / "RcvrChar_B.dat");
    bytes[bytes.size() / 2] ^= 1;
    testsupport::writeFile(folder / "RcvrChar_B.dat", bytes);
    bench.simulator->clearTranscript();
    const std::string text =
        testsupport::errorOf([&] { storage::restoreEntry(context, folder, manifest.entries[0]); });
    EXPECT_NE(text.find("is not what was saved"), std::string::npos) << text;
    EXPECT_TRUE(bench.commands().empty());
    EXPECT_EQ(storage::readStoredImage(bench.context(), "B"), stored);
}
