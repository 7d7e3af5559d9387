#include <gtest/gtest.h>

#include <cmath>

#include "ErrorOf.h"
#include "SimRun.h"
#include "engine/MeasuredDataImport.h"
#include "engine/TestParameters.h"
#include "storage/ResultProcessing.h"
#include "storage/StoredImage.h"

namespace {

// Judges a run's CSV again as the reprocess command does, against the run's configuration.
storage::Judgement reprocess(enginetest::SimRun& sim, const std::string& receiver,
                             const std::filesystem::path& csv) {
    const auto constants = engine::readRunConstants(sim.config);
    const auto setup = engine::chooseReceiverSetup(constants, receiver, "Port-Search");
    sim.config.SetLFEMode(setup.lfe);
    platform::ScriptedOperatorUi ui;
    engine::CCompressionData store(ui);
    store.loadTestParameters(sim.config, setup.firstBand);
    store.setPowerLevels(*setup.ladder);
    engine::readAllMeasuredData(store, csv);
    store.setNarrowbandLoss(-3);
    store.setNarrowbandAtten("30");
    return storage::judgeResults(store, receiver, false, sim.dir / "raw.txt", ui);
}

}  // namespace

TEST(Reprocess, RebuildsTheRunImageFromItsCsv) {
    enginetest::SimRun sim;
    ASSERT_EQ(sim.run({"A", "R1"}), 0);
    storage::StorageContext context{*sim.analyzer, sim.ui, sim.clock, sim.paths, sim.log};
    for (const std::string name : {"A", "R1"}) {
        const auto stored = storage::readStoredImage(context, name);
        const auto again =
            reprocess(sim, name, sim.workDir() / ("RcvrChar_AllMeasuredData_" + name + ".csv"));
        ASSERT_TRUE(again.passed && again.accepted);
        const auto& image = again.image;
        ASSERT_EQ(image.recordsPresent(), stored.recordsPresent()) << name;
        EXPECT_EQ(image.announcedRecords(), stored.announcedRecords());
        EXPECT_EQ(image.nameCharacters(), stored.nameCharacters());
        for (std::size_t r = 0; r < image.recordsPresent(); ++r) {
            EXPECT_EQ(image.frequency(r), stored.frequency(r));
            for (std::size_t k = 0; k < 4; ++k) {
                const auto a = image.point(r, k);
                const auto b = stored.point(r, k);
                // Equal to the CSV's 8 significant digits.
                EXPECT_NEAR(a.power, b.power, 1e-5 * std::max(1.0f, std::fabs(b.power)));
                EXPECT_NEAR(a.value, b.value, 1e-7 + 1e-7 * std::fabs(b.value) * 10);
                EXPECT_NEAR(a.phase, b.phase, 1e-6 * std::max(1.0f, std::fabs(b.phase)));
            }
        }
    }
}

TEST(Reprocess, RefusesACsvThatDoesNotMatchThePlan) {
    enginetest::SimRun sim;
    ASSERT_EQ(sim.run({"A"}), 0);
    const auto csv = sim.workDir() / "RcvrChar_AllMeasuredData_A.csv";
    std::string text = testsupport::readFile(csv);
    const auto edited = sim.dir / "edited.csv";
    // The second frequency of band 2 (600 MHz) changed in its last digit.
    std::string wrong = text;
    wrong.replace(wrong.find("\n600000000,"), 11, "\n600000001,");
    testsupport::writeFile(edited, wrong);
    EXPECT_EQ(testsupport::errorOf([&] { reprocess(sim, "A", edited); }),
              edited.string() + " line 3: frequency 600000001 differs from the band plan's " +
                  "600000000");
    testsupport::writeFile(edited, text.substr(0, text.find("\n600000000,") + 1));
    EXPECT_EQ(
        testsupport::errorOf([&] { reprocess(sim, "A", edited); }),
        edited.string() + " line 2: the file ends after 1 frequencies; the band plan measures 114");
}
