#pragma once

// Getting a characterization into the analyzer's flash on millimetre-wave systems, and making
// the analyzer load what its flash holds.

#include <string>

#include "storage/RcvrCharImage.h"
#include "storage/StorageContext.h"

namespace storage {

// Writes the image to the receiver's per-port data file (model from readmodel(false)) and
// has the analyzer push that file into flash; analyzer errors are shown and logged. A data
// file that cannot be written raises an error text naming it and the push is not sent, so
// the analyzer never loads a stale or missing file while the run reports success.
void pushPortFile(const StorageContext& context, const std::string& receiver,
                  const RcvrCharImage& image);

// Writes the image into the analyzer's flash and reads it back: raises an error text naming
// the receiver and the first differing word unless the flash holds exactly what was
// written, so that a receiver is never counted as characterized on a corrupted copy.
void writeFlashVerified(const StorageContext& context, const std::string& file,
                        const std::string& name, const RcvrCharImage& image);

// Makes the analyzer reload its stored characterizations; analyzer errors are shown and
// logged. Always sets needsPreparation (the analyzer must be prepared again before the next
// run) and returns true.
bool reloadFromFlash(const StorageContext& context, bool& needsPreparation);

// Drains the analyzer's error queue; when it held errors, shows them in one OK box with the
// caption (plus the given flags) and appends them to the log.
void reportAnalyzerErrors(const StorageContext& context, const std::string& caption,
                          unsigned extraFlags = platform::BoxNone);

}  // namespace storage
