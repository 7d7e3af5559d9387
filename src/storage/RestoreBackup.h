#pragma once

// Writing a backed-up characterization back into the analyzer the way a run stores one.

#include <filesystem>

#include "storage/BackupManifest.h"
#include "storage/StorageContext.h"

namespace storage {

// Checks the data file against the manifest (size and SHA-256), saves what the analyzer now
// holds for the receiver (through context.backups, when set), stores the image (per-port data
// file and push on millimetre-wave systems, verified flash write otherwise), has the analyzer
// load it and reads it back. Raises an error text saying what failed; the analyzer then holds
// either what it held before or, when the failure came after the store, what the read-back
// found.
void restoreEntry(const StorageContext& context, const std::filesystem::path& folder,
                  const BackupEntry& entry);

}  // namespace storage
