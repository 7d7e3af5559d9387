#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <sstream>

#include "SimRun.h"
#include "sim/ReceiverPhysics.h"

namespace {

struct RawRecord {
    double frequency;
    float p[4], c[4], h[4];
};

// The frequency lines of a raw result file.
std::vector<RawRecord> rawRecords(const std::string& text) {
    std::vector<RawRecord> records;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        RawRecord r{};
        if (std::sscanf(line.c_str(), "%lf, (%f,%f,%f), (%f,%f,%f), (%f,%f,%f), (%f,%f,%f)",
                        &r.frequency, &r.p[0], &r.c[0], &r.h[0], &r.p[1], &r.c[1], &r.h[1], &r.p[2],
                        &r.c[2], &r.h[2], &r.p[3], &r.c[3], &r.h[3]) == 13) {
            records.push_back(r);
        }
    }
    return records;
}

}  // namespace

TEST(CharacterizationTruth, StoredCompressionLiesWithinOneLadderStepOfTheClosedForm) {
    enginetest::SimRun sim;
    const std::vector<std::string> all = {"R1", "R2", "R3", "R4", "A", "B", "C", "D"};
    ASSERT_EQ(sim.run(all), 0) << ::testing::PrintToString(sim.notices());
    for (const auto& name : all) {
        EXPECT_EQ(sim.findings[name], 2) << name;
    }
    const double step = sim.config.GetConstant("testpowerstep");
    const float levels[4] = {0.05f, 0.1f, 0.2f, 0.5f};
    for (const auto& name : all) {
        const auto& physics = sim.simulator->scenario().receiver(name);
        const auto records =
            rawRecords(testsupport::readFile(sim.workDir() / ("rcvrCharRaw_" + name + ".txt")));
        ASSERT_FALSE(records.empty()) << name;
        int checked = 0;
        for (const auto& record : records) {
            for (int k = 0; k < 4; ++k) {
                const bool copy =
                    k > 0 && record.p[k] == record.p[k - 1] && record.c[k] == record.c[k - 1];
                if (record.c[k] >= 0 || copy) {
                    continue;
                }
                const double input = sim::compressionInputPowerDbm(physics, levels[k]);
                const double reading = input + sim::compressionDb(physics, input);
                EXPECT_LE(std::fabs(record.p[k] - reading), step + 1e-3)
                    << name << " at " << record.frequency << " Hz, level " << levels[k];
                ++checked;
            }
        }
        // Most frequencies reach most levels.
        EXPECT_GT(checked, static_cast<int>(records.size()) * 2) << name;
    }
}
