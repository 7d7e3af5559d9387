#pragma once

// Reading back the characterization that the analyzer holds for a receiver.

#include <string>

#include "storage/RcvrCharImage.h"
#include "storage/StorageContext.h"

namespace storage {

// The flash name of a receiver: its short name ("R1_LFE" for "R1 LOW FREQUENCY EXTENSION").
std::string flashName(const std::string& receiver);

// On millimetre-wave systems the receiver's per-port data file (model from readmodel(false));
// otherwise the reply to "DIAG:flasharray?" for its flash name. A file that cannot be opened
// gives an empty image; callers judge the image with completeness().
RcvrCharImage readStoredImage(const StorageContext& context, const std::string& receiver);

}  // namespace storage
