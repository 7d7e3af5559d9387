#include <gtest/gtest.h>

#include <algorithm>
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

// The receiver's input power whose reading P + C(P) is `reading`: the reading grows
// monotonically with the input power, so bisection finds it.
double inputPowerOfReading(const sim::ReceiverParameters& physics, double reading,
                           double frequencyHz) {
    double low = reading - 1.0;
    double high = reading + 60.0;
    for (int i = 0; i < 100; ++i) {
        const double mid = (low + high) / 2;
        if (mid + sim::compressionDb(physics, mid, frequencyHz) < reading) {
            low = mid;
        } else {
            high = mid;
        }
    }
    return (low + high) / 2;
}

}  // namespace

// Psat moves by about 4 dB across the bands and by up to 0.4 dB between neighbouring
// frequencies, so a record stored against another frequency than the one measured fails.
TEST(CharacterizationTruth, EveryRecordSitsOnTheClosedFormAtItsOwnFrequency) {
    enginetest::SimRun sim(R"("receivers": {"*": {"psat_slope_db_per_ghz": 0.1,
        "psat_ripple_db": 1.0, "psat_ripple_period_ghz": 4.0}})");
    const std::vector<std::string> all = {"R1", "R2", "R3", "R4", "A", "B", "C", "D"};
    ASSERT_EQ(sim.run(all), 0) << ::testing::PrintToString(sim.notices());
    for (const auto& name : all) {
        EXPECT_EQ(sim.findings[name], 2) << name;
    }
    const double step = sim.config.GetConstant("testpowerstep");
    const double referenceDbm = sim.config.GetConstant("refpower");
    const float levels[4] = {0.05f, 0.1f, 0.2f, 0.5f};
    for (const auto& name : all) {
        const auto& physics = sim.simulator->scenario().receiver(name);
        // Reference receivers sit behind the 20 dB pad or the 21 dB delay line.
        const std::vector<double> pads =
            name[0] == 'R' ? std::vector<double>{20.0, 21.0} : std::vector<double>{0.0};
        const auto records =
            rawRecords(testsupport::readFile(sim.workDir() / ("rcvrCharRaw_" + name + ".txt")));
        ASSERT_FALSE(records.empty()) << name;
        int checked = 0;
        for (const auto& record : records) {
            const double f = record.frequency;
            const std::string where = name + " at " + std::to_string(f) + " Hz";
            std::vector<int> found;
            for (int k = 0; k < 4; ++k) {
                const bool copy =
                    k > 0 && record.p[k] == record.p[k - 1] && record.c[k] == record.c[k - 1];
                if (record.c[k] < 0 && !copy) {
                    found.push_back(k);
                }
            }
            if (found.empty()) {
                continue;
            }
            // A level's ratio reads C(P) - C(P_ref) with P the input power of its reading,
            // so every level of the record implies the reference's compression C(P_ref).
            auto impliedReference = [&](int k) {
                const double input = inputPowerOfReading(physics, record.p[k], f);
                return sim::compressionDb(physics, input, f) - record.c[k];
            };
            const double reference = impliedReference(found.front());
            double padError = 1.0;
            for (double pad : pads) {
                padError = std::min(
                    padError,
                    std::fabs(reference - sim::compressionDb(physics, referenceDbm - pad, f)));
            }
            EXPECT_LT(padError, 2e-4) << where;
            for (int k : found) {
                EXPECT_NEAR(reference, impliedReference(k), 2e-4)
                    << where << ", level " << levels[k];
                // t*_k = P*_k - X_k - |C(P_ref)|, P*_k compressed by X_k + |C(P_ref)|.
                const double x = levels[k] - reference;
                const double truth = sim::compressionInputPowerDbm(physics, x, f) - x;
                EXPECT_LE(std::fabs(record.p[k] - truth), step + 1e-3)
                    << where << ", level " << levels[k];
                ++checked;
            }
        }
        // Most frequencies reach most levels.
        EXPECT_GT(checked, static_cast<int>(records.size()) * 2) << name;
    }
}
