#include <gtest/gtest.h>

#include <cmath>
#include <sstream>

#include "TempDir.h"
#include "config/T3872Acomcal.h"

namespace {

using Texts = std::vector<std::string>;

std::unique_ptr<CT3872Acomcal> readSample(const std::string& model, const Texts& options) {
    auto config = std::make_unique<CT3872Acomcal>();
    config->SetModel(model);
    config->SetOptions(options);
    config->ReadSequence(testsupport::sampleConfiguration().string());
    return config;
}

// The dialog's receiver list: the calibration order, else the port calibrations.
Texts receivers(const CNAData& config) {
    Texts order;
    config.GetOrder(order);
    return order.empty() ? config.CalibrationsForPorts(config.RequiredPorts()) : order;
}

int ladderLevels(double start, double stop, double step) {
    return static_cast<int>((stop - start) / step + 1.00001);
}

struct SampleModel {
    std::string model;
    Texts options;
};

class SampleConfiguration : public ::testing::TestWithParam<SampleModel> {};

TEST_P(SampleConfiguration, HoldsEverythingARunReads) {
    auto config = readSample(GetParam().model, GetParam().options);
    std::istringstream runConstants(
        "minband maxband pntsperband teststartpower teststoppower testpowerstep RChannel_minband "
        "RChannelPwr_TstMin RChannelPwr_TstMx RChannelPwr_TstStep RChannelRef refpower "
        "SPAMClipPower CalPowDelta minCompStepRatio MaxMeasuredFrequency testifbw refaverages "
        "IFBWOnOff testAtten RChannelAtten ExternalR1 testaverages");
    for (std::string name; runConstants >> name;) {
        EXPECT_TRUE(config->HasConstant(name)) << name;
    }
    EXPECT_GE(
        ladderLevels(config->GetConstant("teststartpower"), config->GetConstant("teststoppower"),
                     config->GetConstant("testpowerstep")),
        6);
    // Every band from 0 to maxband is defined and can be spread over its points.
    int maxband = static_cast<int>(config->GetConstant("maxband"));
    for (int band = 0; band <= maxband; ++band) {
        const BandDefaults& b = config->GetBandDefaults(band);
        EXPECT_TRUE(b.m_points == 0 || b.m_points >= 2) << band;
        EXPECT_LT(b.m_startFreq, b.m_stopFreq) << band;
        if (band > 0) {
            EXPECT_GT(b.m_startFreq, config->GetBandDefaults(band - 1).m_stopFreq) << band;
        }
    }
    for (const auto& name : receivers(*config)) {
        const std::string& port = config->Calibration(name).GetPort();
        EXPECT_EQ(port.rfind("Port ", 0), 0U) << name;
        EXPECT_NE(port.find(",\"RCVR "), std::string::npos) << name;
    }
}

INSTANTIATE_TEST_SUITE_P(
    Models, SampleConfiguration,
    ::testing::Values(SampleModel{"T3872A", {"010", "080"}}, SampleModel{"T3872A", {"No Options"}},
                      SampleModel{"T3872B", {"010"}}, SampleModel{"T3951A", {"010", "080", "401"}},
                      SampleModel{"T3871B", {"010"}}, SampleModel{"T3877A", {"080"}}),
    [](const auto& info) { return info.param.model + "_" + std::to_string(info.index); });

TEST(SampleDefaultAnalyzer, ModestPlanAndOptionChosenColumns) {
    auto config = readSample("T3872A", {"010", "080"});
    int frequencies = 0;
    for (int band = static_cast<int>(config->GetConstant("minband"));
         band <= config->GetConstant("maxband"); ++band) {
        frequencies += config->GetBandDefaults(band).m_points;
    }
    EXPECT_GE(frequencies, 50);
    EXPECT_LE(frequencies, 150);
    EXPECT_EQ(
        ladderLevels(config->GetConstant("teststartpower"), config->GetConstant("teststoppower"),
                     config->GetConstant("testpowerstep")),
        16);
    // No measured frequency lies above the measured range.
    EXPECT_LT(
        config->GetBandDefaults(static_cast<int>(config->GetConstant("maxband"))).m_stopFreq + 0.1,
        config->GetConstant("MaxMeasuredFrequency"));
    // Option-chosen columns: AOPT=080 path, OOPT=010 080 preset powers.
    EXPECT_NE(config->Calibration("R1").GetPathConfiguration().find("Opt 080"), std::string::npos);
    EXPECT_EQ(config->GetPresetPowers().at("R1"), -12.0F);
    auto plain = readSample("T3872A", {"010"});
    EXPECT_EQ(plain->Calibration("R1").GetPathConfiguration().find("Opt 080"), std::string::npos);
    EXPECT_EQ(plain->GetPresetPowers().at("R1"), -10.0F);
}

TEST(SampleMillimetreWave, BandsAboveTheMeasuredRange) {
    auto config = readSample("T3951A", {"010", "080", "401"});
    double limit = config->GetConstant("MaxMeasuredFrequency");
    int maxband = static_cast<int>(config->GetConstant("maxband"));
    int measured = 0;
    for (int band = 0; band <= maxband; ++band) {
        const BandDefaults& b = config->GetBandDefaults(band);
        if (b.m_startFreq < limit) {
            ++measured;
            EXPECT_LT(b.m_stopFreq + 0.1, limit) << band;
        }
    }
    EXPECT_LT(measured, maxband + 1);
    EXPECT_GT(measured, static_cast<int>(config->GetConstant("minband")));
}

TEST(SampleDirectSearch, NoPrerequisitesWithReferencePadAndExternalR1) {
    auto config = readSample("T3871B", {"010"});
    bool portSearch = true;
    EXPECT_TRUE(config->Prerequisites(config->RequiredPorts(), portSearch).empty());
    EXPECT_FALSE(portSearch);
    EXPECT_NE(config->GetConstant("RChannelAtten"), 0);
    EXPECT_NE(config->GetConstant("ExternalR1"), 0);
}

TEST(SampleLowFrequencyExtension, LfeReceiversAndBands) {
    auto config = readSample("T3877A", {"080"});
    Texts names = receivers(*config);
    EXPECT_NE(std::find(names.begin(), names.end(), "R1 LOW FREQUENCY EXTENSION"), names.end());
    EXPECT_NE(std::find(names.begin(), names.end(), "R2 LOW FREQUENCY EXTENSION"), names.end());
    for (const char* name : {"LFEminband", "LFEmaxband", "LFEteststoppower",
                             "LFEtestifbwCutOffBand", "LFEtestifbw", "LFEcutofftestifbw"}) {
        EXPECT_TRUE(config->HasConstant(name)) << name;
    }
    for (int band = static_cast<int>(config->GetConstant("LFEminband"));
         band <= config->GetConstant("LFEmaxband"); ++band) {
        EXPECT_GE(config->GetLFEBandDefaults(band).m_points, 2) << band;
    }
    EXPECT_EQ(config->Calibration("R1 LOW FREQUENCY EXTENSION").GetPort(),
              "Port 1,R1/A,\"RCVR R1 IN\",LowFreqExt");
}

}  // namespace
