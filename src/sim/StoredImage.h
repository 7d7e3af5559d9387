#pragma once

// Characterizations that a scenario puts into the instrument before the first run: images
// in the stored format (11-word header, 28-word records, little-endian words) whose
// compression points are the receiver's closed-form truth at each record's frequency.

#include <cstdint>
#include <string>
#include <vector>

#include "sim/Scenario.h"

namespace sim {

// A valid image of `records` frequency records from 10 MHz to 26.5 GHz for the receiver.
std::vector<std::uint16_t> makeStoredImage(const std::string& receiver,
                                           const ReceiverParameters& physics, long records);
// A block of exactly `words` words: the start of a valid image, as long as asked.
std::vector<std::uint16_t> makeStoredBlock(const std::string& receiver,
                                           const ReceiverParameters& physics, long words);

}  // namespace sim
