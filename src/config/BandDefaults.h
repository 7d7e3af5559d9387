#pragma once

#include <cstdint>

// One band of a band table. Start, stop, points and power limit come from the
// configuration; -999 marks a value not set.
struct BandDefaults {
    double m_startFreq = -999;  // Hz
    double m_stopFreq = -999;   // Hz
    std::int32_t m_points = -999;
    double m_powerLimit = 30.0;  // dBm, highest source power swept in this band
};
