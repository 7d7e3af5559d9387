#pragma once

// A configuration model filled in code, with every constant a run reads, so each test states
// only what it changes.

#include <map>
#include <string>

#include "config/NAData.h"

namespace enginetest {

class TestConfiguration : public CNAData {
  public:
    TestConfiguration() {
        SetModel("T3872A");
        SetOptions({"010", "080"});
        const std::map<std::string, double> constants = {
            {"minband", 1},
            {"LFEminband", 0},
            {"teststartpower", -30},
            {"teststoppower", 0},
            {"LFEteststoppower", -10},
            {"testpowerstep", 2},
            {"RChannel_minband", 1},
            {"RChannelPwr_TstMin", -20},
            {"RChannelPwr_TstMx", 0},
            {"RChannelPwr_TstStep", 5},
            {"RChannelRef", -25},
            {"refpower", -30},
            {"SPAMClipPower", 10},
            {"CalPowDelta", 1},
            {"minCompStepRatio", 0.5},
            {"MaxMeasuredFrequency", 20e9},
            {"maxband", 2},
            {"LFEmaxband", 1},
            {"LFEtestifbwCutOffBand", 0},
            {"LFEtestifbw", 100},
            {"LFEcutofftestifbw", 300},
            {"testifbw", 1000},
            {"refaverages", 2},
            {"IFBWOnOff", 1},
            {"testAtten", 0},
            {"RChannelAtten", 0},
            {"ExternalR1", 0},
            {"testaverages", 2},
        };
        for (const auto& [name, value] : constants) {
            SetConstant(name, value);
        }
        setBand(0, 10e6, 50e6, 5, 30);
        setBand(1, 100e6, 1e9, 4, 30);
        setBand(2, 2e9, 6e9, 3, -10);
        setBand(0, 1e5, 5e5, 3, 30, true);
        setBand(1, 1e6, 9e6, 5, 30, true);
        for (const char* receiver : {"R1", "A", "B"}) {
            CCalibration calibration(receiver);
            const std::string name(receiver);
            calibration.SetPort(name == "B" ? "Port 2,B/R2,\"RCVR B IN\""
                                            : "Port 1," + name + "/R1,\"RCVR " + name + " IN\"");
            AddCalibration(calibration);
        }
        CCalibration lfe("R1 LOW FREQUENCY EXTENSION");
        lfe.SetPort("Port 1,R1/R1,\"RCVR R1 IN\"");
        AddCalibration(lfe);
    }

    void setBand(int band, double start, double stop, int points, double limit, bool lfe = false) {
        BandDefaults defaults;
        defaults.m_startFreq = start;
        defaults.m_stopFreq = stop;
        defaults.m_points = points;
        defaults.m_powerLimit = limit;
        BandMap(lfe)[band] = defaults;
    }

    void BuildBands(const CCSVTable&, bool) override {}
    int StepCount(const std::vector<std::string>&) const override { return 0; }
    bool NextBand() override { return false; }
    bool FirstBand() override { return true; }
};

}  // namespace enginetest
