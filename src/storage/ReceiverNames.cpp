#include "storage/ReceiverNames.h"

#include <array>
#include <utility>

namespace storage {

std::string shortReceiverName(const std::string& receiver) {
    static const std::array<std::pair<const char*, const char*>, 4> kTable{{
        {"R1 LOW FREQUENCY EXTENSION", "R1_LFE"},
        {"R2 LOW FREQUENCY EXTENSION", "R2_LFE"},
        {"R3 LOW FREQUENCY EXTENSION", "R3_LFE"},
        {"R4 LOW FREQUENCY EXTENSION", "R4_LFE"},
    }};
    for (const auto& [display, shortName] : kTable) {
        if (receiver == display) {
            return shortName;
        }
    }
    return receiver;
}

bool isLowFrequencyExtension(const std::string& receiver) {
    return receiver.find("LOW FREQUENCY EXTENSION") != std::string::npos;
}

}  // namespace storage
