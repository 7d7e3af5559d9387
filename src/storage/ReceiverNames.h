#pragma once

// Receiver names as the configuration gives them, and the short names that stand for them in
// file names, flash names and result processing.

#include <string>

namespace storage {

// "R1 LOW FREQUENCY EXTENSION" to "R4 LOW FREQUENCY EXTENSION" become "R1_LFE" to "R4_LFE";
// every other name is its own short name.
std::string shortReceiverName(const std::string& receiver);

// True for a name that holds "LOW FREQUENCY EXTENSION".
bool isLowFrequencyExtension(const std::string& receiver);

}  // namespace storage
