#include <gtest/gtest.h>

#include <sstream>

#include "ErrorOf.h"
#include "SimBench.h"
#include "storage/EraseCal.h"
#include "storage/ExportCals.h"
#include "storage/ExportText.h"
#include "storage/FlashTransfer.h"
#include "storage/StoredImage.h"

using storage::CatalogFindings;
using storage::RcvrCharImage;
using storagetest::SimBench;

namespace {

const std::string kPort2Test =
    "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\T3951A Broadband\\Port 2\\"
    "Factory Cal Data\\RcvrCharTest.dat";

}  // namespace

TEST(EraseCal, MillimetreWaveDeletesTheFileAndPushesItsPort) {
    SimBench bench(std::string(storagetest::kMillimetreWave) +
                   R"(, "stored": [{"receiver": "B", "age_days": 1, "records": 2}])");
    ASSERT_TRUE(std::filesystem::exists(bench.local(kPort2Test)));
    CatalogFindings findings{{"B", 1}};
    storage::eraseCal(bench.context(), *bench.processes, "B", findings);
    EXPECT_EQ(bench.processes->commands, std::vector<std::string>{"del \"" + kPort2Test + "\""});
    EXPECT_FALSE(std::filesystem::exists(bench.local(kPort2Test)));
    EXPECT_EQ(bench.commands(), std::vector<std::string>{"diag:mm:data:push 2,0"});
    EXPECT_EQ(bench.logLines(), (std::vector<std::string>{
                                    "Initialized file", "After deleting flash file  " + kPort2Test,
                                    "diag:mm:data:push 2,0"}));
    EXPECT_EQ(findings["B"], 3);
}

TEST(EraseCal, MillimetreWaveErrorBoxIsOwnedByTheDialog) {
    SimBench bench(std::string(storagetest::kMillimetreWave) + R"(, "faults": {"scpi_errors": [
        {"command": "diag:mm:data:push", "errors": ["-256,\"File name not found\""]}]})");
    bench.ui.answer("SCPI Error Writing Flash", {platform::Answer::Ok});
    CatalogFindings findings;
    storage::eraseCal(bench.context(), *bench.processes, "R1 LOW FREQUENCY EXTENSION", findings);
    ASSERT_EQ(bench.ui.boxes().size(), 1u);
    EXPECT_EQ(bench.ui.boxes()[0].box.flags, platform::BoxSystemModal | platform::BoxOwnedByDialog);
    EXPECT_EQ(bench.commands(), std::vector<std::string>{"diag:mm:data:push 1,0"});
    EXPECT_EQ(findings["R1 LOW FREQUENCY EXTENSION"], 3);
}

TEST(EraseCal, FlashAnalyzerErasesByFlashNameWithoutLogOrErrorCheck) {
    SimBench bench(R"("stored": [{"receiver": "R1", "age_days": 1, "records": 2}])");
    CatalogFindings findings{{"R1 LOW FREQUENCY EXTENSION", -1}};
    storage::eraseCal(bench.context(), *bench.processes, "R1 LOW FREQUENCY EXTENSION", findings);
    storage::eraseCal(bench.context(), *bench.processes, "R1", findings);
    EXPECT_EQ(bench.commands(),
              (std::vector<std::string>{"DIAG:FLASH:file:erase \"RCVRCHAR\",\"R1_LFE\"",
                                        "DIAG:FLASH:file:erase \"RCVRCHAR\",\"R1\""}));
    EXPECT_TRUE(bench.processes->commands.empty());
    EXPECT_EQ(bench.logLines(), std::vector<std::string>{"Initialized file"});
    EXPECT_EQ(findings, (CatalogFindings{{"R1 LOW FREQUENCY EXTENSION", 3}, {"R1", 3}}));
    EXPECT_EQ(storage::readStoredImage(bench.context(), "R1").wordCount(), 1u);
}

TEST(ExportCals, AnsweringNoWritesNothing) {
    SimBench bench(R"("stored": [{"receiver": "A", "age_days": 1, "records": 2}])");
    bench.ui.answer("Export calibration?", {platform::Answer::No});
    storage::exportCals(bench.context(), {"A"}, {{"A", 1}});
    auto boxes = bench.ui.boxes();
    ASSERT_EQ(boxes.size(), 1u);
    EXPECT_EQ(boxes[0].box.text,
              "Would you like to export your current receiver characterization to text files?");
    EXPECT_EQ(boxes[0].box.buttons, platform::Buttons::YesNo);
    EXPECT_TRUE(bench.commands().empty());
    EXPECT_FALSE(std::filesystem::exists(bench.workDir() / "RcvrChar_A_Exported.txt"));
}

TEST(ExportCals, FlashImagesExportInListOrderSkippingNothingStored) {
    SimBench bench(R"("stored": [{"receiver": "R1", "age_days": 1, "records": 3},
                                 {"receiver": "A", "age_days": 20, "records": 2}])");
    bench.ui.answer("Export calibration?", {platform::Answer::Yes});
    storage::exportCals(bench.context(), {"R1", "R2", "A"}, {{"R1", 1}, {"R2", 0}, {"A", -1}});
    EXPECT_EQ(bench.commands(), (std::vector<std::string>{"DIAG:flasharray? \"RCVRCHAR\",\"R1\"",
                                                          "DIAG:flasharray? \"RCVRCHAR\",\"A\""}));
    std::string r1 = testsupport::readFile(bench.workDir() / "RcvrChar_R1_Exported.txt");
    EXPECT_EQ(r1.rfind("1\nR1\n25\n-3\n30\n10000000, (", 0), 0u) << r1;
    EXPECT_EQ(std::count(r1.begin(), r1.end(), '\n'), 4 + 3);
    EXPECT_NE(r1.back(), '\n');
    EXPECT_EQ(std::count(r1.begin(), r1.end(), '('), 3 * 4);
    EXPECT_TRUE(std::filesystem::exists(bench.workDir() / "RcvrChar_A_Exported.txt"));
}

TEST(ExportCals, ImageWithoutHeaderEndsTheExport) {
    // R2 erased since start-up (state 3) finds nothing and ends the export before A.
    SimBench bench(R"("stored": [{"receiver": "R1", "age_days": 1, "records": 1},
                                 {"receiver": "A", "age_days": 1, "records": 1}])");
    auto result = storage::exportStoredCals(bench.context(), {"R1", "R2", "A"},
                                            {{"R1", 1}, {"R2", 3}, {"A", 1}});
    EXPECT_EQ(result.files, std::vector<std::string>{"RcvrChar_R1_Exported.txt"});
    EXPECT_EQ(result.endedAt, "R2");
    EXPECT_EQ(result.reason, "the image holds 1 words, fewer than the 11 of its header");
    EXPECT_FALSE(std::filesystem::exists(bench.workDir() / "RcvrChar_R2_Exported.txt"));
    EXPECT_FALSE(std::filesystem::exists(bench.workDir() / "RcvrChar_A_Exported.txt"));
}

TEST(ExportCals, MillimetreWaveReadsPortFilesAndLowFrequencyNamesUseTheirFlashName) {
    SimBench bench(storagetest::kMillimetreWave);
    auto image = RcvrCharImage::withHeader("R1", 1, -1.5f, 20.0f);
    image.appendZeroRecord(5e6);
    storage::pushPortFile(bench.context(), "R1", image);
    auto result = storage::exportStoredCals(bench.context(), {"R1 LOW FREQUENCY EXTENSION", "B"},
                                            {{"R1 LOW FREQUENCY EXTENSION", 1}, {"B", 1}});
    // B has no data file: an empty image ends the export.
    EXPECT_EQ(result.files, std::vector<std::string>{"RcvrChar_R1_LFE_Exported.txt"});
    EXPECT_EQ(result.endedAt, "B");
    EXPECT_EQ(testsupport::readFile(bench.workDir() / "RcvrChar_R1_LFE_Exported.txt"),
              "1\nR1\n25\n-1.5\n20\n5000000, (0,0,0), (0,0,0), (0,0,0), (0,0,0)");
}

TEST(ExportCals, UnwritableExportFileRaisesNamingIt) {
    SimBench bench(R"("stored": [{"receiver": "A", "age_days": 1, "records": 1}])");
    std::filesystem::create_directories(bench.workDir() / "RcvrChar_A_Exported.txt" / "x");
    auto text = testsupport::errorOf([&] {
        storage::exportStoredCals(bench.context(), {"A"}, {{"A", 1}});
    });
    EXPECT_EQ(text.rfind("Cannot write the export file RcvrChar_A_Exported.txt (", 0), 0u) << text;
}

TEST(StoredImageRoundTrip, FlashAndPortFileGiveBackTheImageAndItsExport) {
    auto image = RcvrCharImage::withHeader("C", 2, -4.75f, 30.0f);
    image.appendZeroRecord(1e7);
    image.appendRecord(2.5e9, {{{-20.125f, -0.051f, -0.2f},
                                {-19.5f, -0.102f, -0.4f},
                                {-18.25f, -0.203f, -0.8f},
                                {-16.0f, -0.51f, -2.0f}}});
    std::ostringstream expected;
    storage::writeExportText(expected, image);
    for (bool portFile : {false, true}) {
        SimBench bench(portFile ? storagetest::kMillimetreWave : "");
        if (portFile) {
            storage::pushPortFile(bench.context(), "C", image);
        } else {
            bench.analyzer->flasharray("RcvrChar", "C", image.words());
        }
        EXPECT_EQ(storage::readStoredImage(bench.context(), "C"), image) << portFile;
        storage::exportStoredCals(bench.context(), {"C"}, {{"C", 2}});
        EXPECT_EQ(testsupport::readFile(bench.workDir() / "RcvrChar_C_Exported.txt"),
                  expected.str())
            << portFile;
    }
}
