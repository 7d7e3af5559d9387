#pragma once

// Finding out, at start-up, which receivers the analyzer already holds a characterization for
// and how old it is: from the flash catalog, or on millimetre-wave systems from a directory
// listing of each receiver's per-port data file.

#include <chrono>
#include <string>
#include <vector>

#include "platform/ProcessRunner.h"
#include "storage/CatalogFindings.h"
#include "storage/StorageContext.h"

namespace storage {

// Gives every receiver of the list a state (a name already in the map keeps its own), then
// sets the state of each receiver found stored. The listing file "fileInfo.txt" is written by
// the command interpreter into the working directory and left there.
void catalogFlash(const StorageContext& context, platform::ProcessRunner& processes,
                  const std::vector<std::string>& receivers, CatalogFindings& findings,
                  std::chrono::system_clock::time_point now = std::chrono::system_clock::now());

}  // namespace storage
