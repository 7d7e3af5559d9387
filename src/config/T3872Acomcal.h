#pragma once

#include <string>
#include <vector>

#include "config/NAData.h"

// The configuration model the dialog owns: adds the band-table builder and the
// "Order / Power" settings (test power range, calibration order, first band).
class CT3872Acomcal : public CNAData {
  public:
    CT3872Acomcal() = default;
    ~CT3872Acomcal() override = default;

    // Reads the band block's "BandNum", "Start_freq", "Stop_freq" and the optional "Points"
    // (else the constant pntsperband) and "PowerLimit" (else 30 dBm) columns.
    void BuildBands(const CCSVTable& bandTable, bool lfe) override;
    // CNAData::ReadSequence, then the model's "Order / Power" block when there is one.
    void ReadSequence(const std::string& path) override;
    int StepCount(const std::vector<std::string>& calibrationNames) const override;
    bool NextBand() override;
    bool FirstBand() override;
};
