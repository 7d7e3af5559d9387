#pragma once

// Removing a receiver's stored characterization before it is characterized again.

#include <string>

#include "platform/ProcessRunner.h"
#include "storage/CatalogFindings.h"
#include "storage/StorageContext.h"

namespace storage {

// Millimetre-wave systems: deletes the per-port data file and pushes the port again, with the
// analyzer's errors shown in a box owned by the dialog and logged. Other analyzers: erases the
// receiver's calibration in the flash file, unchecked. Either way the receiver's catalog state
// becomes kCatalogErased.
void eraseCal(const StorageContext& context, platform::ProcessRunner& processes,
              const std::string& receiver, CatalogFindings& findings);

}  // namespace storage
