#pragma once

// What the analyzer is asked to do for one receiver and one band segment: the set-up with
// its reference measurement, and the sweep of each power level into the store.

#include <string>
#include <vector>

#include "engine/SweepContext.h"

namespace engine {

// Bands first..last of the plan (0 = the plan's first band), each at its power.
void setupSegmentSweep(SweepContext& context, int first, int last,
                       const std::vector<double>& powers);

// Instructions, connection checks and the reference measurement for one segment. Always
// returns false.
bool prepareSegment(SweepContext& context, double referencePower, const std::string& receiver,
                    const std::string& portText, const std::string& searchMode, int first, int last,
                    int segment);

// Sweeps power level k at power dBm (limited per band) and files its three traces.
void measurePowerLevel(SweepContext& context, double power, int level, int first, int last);

}  // namespace engine
