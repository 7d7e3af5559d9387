#include <gtest/gtest.h>

#include "ErrorOf.h"
#include "config/T3872Acomcal.h"

namespace {

using testsupport::errorOf;

CCalibration calibration(const std::string& name, const std::string& port, int subs = 1) {
    CCalibration c(name);
    c.SetPort(port);
    for (int i = 0; i < subs; ++i) {
        CSub s("step");
        s.SetPosition(i);
        c.AddSub(s);
    }
    return c;
}

TEST(ConfigurationConstants, NamesIgnoreCase) {
    CT3872Acomcal config;
    config.SetConstant("minband", 2);
    EXPECT_EQ(config.GetConstant("MinBand"), 2);
    EXPECT_TRUE(config.HasConstant("MINBAND"));
    config.SetConstant("MINBAND", 3);
    EXPECT_EQ(config.GetConstant("minband"), 3);
    EXPECT_EQ(config.GetConstants().size(), 1U);
    EXPECT_FALSE(config.HasConstant("maxband"));
}

TEST(ConfigurationBands, WalkFromMinbandToMaxbandAndUnknownOnesAreErrors) {
    CT3872Acomcal config;
    config.SetConstant("minband", 2.9);
    config.SetConstant("maxband", 4);
    std::vector<int> visited;
    for (bool more = config.FirstBand(); more; more = config.NextBand()) {
        visited.push_back(config.GetCurrentBand());
    }
    EXPECT_EQ(visited, (std::vector<int>{2, 3, 4}));
    EXPECT_EQ(config.GetCurrentBand(), 4);
    EXPECT_EQ(errorOf([&] { config.GetLFEBandDefaults(0); }),
              "CNAData::GetLFEBandDefaults - Unknown Band (0)");
    EXPECT_EQ(errorOf([&] { config.RequiredPorts(); }), "No Port is selected to calibrate");
    config.SetConstant("minband", 1e12);
    EXPECT_EQ(errorOf([&] { config.FirstBand(); }), "minband 1e+12 is not a usable whole number");
}

TEST(ConfigurationCalibrations, PortsMatchTextBeforeFirstComma) {
    CT3872Acomcal config;
    config.AddCalibration(calibration("R1", "Port 1,R1/A,\"RCVR R1 IN\""));
    config.AddCalibration(calibration("A", "Port 1,A/R1,\"RCVR A IN\""));
    config.AddCalibration(calibration("B", "Port 2,B/R2,\"RCVR B IN\""));
    config.AddCalibration(calibration("X", "Port 3"));
    EXPECT_EQ(config.CalibrationsForPorts({"Port 2", "Port 1"}),
              (std::vector<std::string>{"R1", "A", "B"}));
    EXPECT_EQ(config.CalibrationsForPorts({"Port 1", "Port 1"}),
              (std::vector<std::string>{"R1", "R1", "A", "A"}));
    EXPECT_EQ(config.CalibrationsForPorts({"port 1", "Port"}), std::vector<std::string>{});
    EXPECT_EQ(config.CalibrationsForPorts({"Port 3"}), std::vector<std::string>{"X"});
}

TEST(ConfigurationCalibrations, LookupByExactNameOrCurrent) {
    CT3872Acomcal config;
    config.AddCalibration(calibration("A", "Port 1,x", 1));
    EXPECT_EQ(errorOf([&] { config.Calibration(); }),
              "CNAData::Calibration - Unknown calibration (None Set)");
    EXPECT_EQ(errorOf([&] { config.Calibration("a"); }),
              "CNAData::Calibration - Unknown calibration (a)");
    config.SetCurrentCalibration("A");
    EXPECT_EQ(config.Calibration().GetPort(), "Port 1,x");
    config.AddCalibration(calibration("A", "Port 2,y", 3));
    ASSERT_EQ(config.GetCalibrations().size(), 1U);
    EXPECT_EQ(config.Calibration("A").GetPort(), "Port 2,y");
    EXPECT_EQ(config.Calibration("A").SubCount(), 3);
}

TEST(ConfigurationCalibrations, StepCountMultipliesByBands) {
    CT3872Acomcal config;
    config.AddCalibration(calibration("A", "Port 1", 2));
    config.AddCalibration(calibration("B", "Port 2", 3));
    config.SetConstant("minband", 2);
    config.SetConstant("maxband", 4.5);
    EXPECT_EQ(config.StepCount({"A", "B"}), 15);
    EXPECT_EQ(config.StepCount({}), 0);
}

TEST(ConfigurationPresets, StoredUnderCurrentCalibration) {
    CT3872Acomcal config;
    config.SetCurrentCalibration("R1");
    config.SetPresetPower(-10.5F);
    config.SetPresetPower(-12.0F);
    config.SetCurrentCalibration("A");
    config.SetPresetPower(-5.0F);
    EXPECT_EQ(config.GetPresetPowers(),
              (std::map<std::string, float>{{"A", -5.0F}, {"R1", -12.0F}}));
}

TEST(ConfigurationLifetime, RegistersAsTalkerWhileAlive) {
    std::size_t before = platform::CDiagnostic::TalkerCount();
    {
        CT3872Acomcal config;
        EXPECT_EQ(platform::CDiagnostic::TalkerCount(), before + 1);
    }
    EXPECT_EQ(platform::CDiagnostic::TalkerCount(), before);
}

}  // namespace
