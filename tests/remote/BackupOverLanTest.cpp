// Backups and restore against an analyzer on the network: the stored characterization is read
// through the instrument (flash, or the analyzer computer's files), and written back the same
// way.

#include <gtest/gtest.h>

#include "RunRcvrchar.h"
#include "ServedSimulator.h"
#include "TempDir.h"

namespace {

using remotetest::ServedSimulator;

// Exports over the network; the text of the receiver's export file, or empty when the
// analyzer holds none for it.
std::string exported(const testsupport::TempDir& dir, const std::string& resource,
                     const std::string& receiver) {
    const std::string name = "RcvrChar_" + receiver + "_Exported.txt";
    std::filesystem::remove(dir / "work" / name);
    const auto run =
        clitest::runRcvrchar(dir, "export --workdir work --clock virtual --analyzer " + resource);
    EXPECT_EQ(run.status, 0) << run.err;
    return run.out.find(name) == std::string::npos ? ""
                                                   : testsupport::readFile(dir / "work" / name);
}

void eraseBackUpAndRestore(const std::string& scenario, const std::string& receiver) {
    testsupport::TempDir dir;
    std::filesystem::create_directories(dir / "work");
    std::filesystem::copy_file(testsupport::sampleConfiguration(), dir / "work" / "RcvrChar.dat");
    testsupport::writeFile(dir / "scenario.json", scenario);
    ServedSimulator served(dir / "state", (dir / "scenario.json").string());
    const std::string before = exported(dir, served.resource(), receiver);
    ASSERT_FALSE(before.empty());

    // R1 is selected; the old-sized characterization is erased, and the run stops there.
    testsupport::writeFile(dir / "answers.txt",
                           "Delete previous calibrations? = Yes\nReload now? = No\n"
                           "Cal selections adjusted = OK\nExit without finishing cal? = Yes\n"
                           "Restart the analyzer application = OK\n");
    const auto dialog = clitest::runRcvrchar(
        dir,
        "--workdir work --clock virtual --analyzer " + served.resource() + " --answers answers.txt",
        "clear\nselect R1\nrun\n");
    ASSERT_EQ(dialog.status, 0) << dialog.out << dialog.err;
    const std::string line =
        "Erased and not characterized again: " + receiver + "; its backup is in ";
    const auto at = dialog.out.find(line);
    ASSERT_NE(at, std::string::npos) << dialog.out;
    const std::filesystem::path folder =
        dialog.out.substr(at + line.size(), dialog.out.find('\n', at) - at - line.size());
    EXPECT_EQ(testsupport::readFile(folder / ("RcvrChar_" + receiver + "_Exported.txt")), before);
    EXPECT_EQ(exported(dir, served.resource(), receiver), "");

    const auto restore = clitest::runRcvrchar(
        dir, "restore '" + folder.string() + "' --receiver " + receiver +
                 " --workdir work --clock virtual --analyzer " + served.resource());
    ASSERT_EQ(restore.status, 0) << restore.out << restore.err;
    EXPECT_NE(restore.out.find(receiver + ": restored from "), std::string::npos);
    EXPECT_NE(restore.out.find("read back equal"), std::string::npos);
    EXPECT_EQ(exported(dir, served.resource(), receiver), before);
}

}  // namespace

TEST(BackupOverTheNetwork, AnErasedFlashCharacterizationIsBackedUpAndRestored) {
    eraseBackUpAndRestore(
        testsupport::readFile(RCVRCHAR_SOURCE_DIR "/data/scenarios/stored-calibrations.json"), "A");
}

TEST(BackupOverTheNetwork, AnErasedPerPortDataFileIsBackedUpAndRestored) {
    eraseBackUpAndRestore(R"({"idn": "Velquor Technologies,T3872B,MY00000002,A.13.55.06",
        "options": "010,080,029", "mmwave_catalog": "Default,T3951A Broadband",
        "mmwave_active": "T3951A Broadband",
        "stored": [{"receiver": "R2", "age_days": 3, "records": 2}]})",
                          "R2");
}
