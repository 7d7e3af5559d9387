#pragma once

// Finding out, at start-up, which receivers the analyzer already holds a characterization for
// and how old it is: from the flash catalog, or on millimetre-wave systems from a directory
// listing of each receiver's per-port data file.

#include <chrono>
#include <istream>
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

// Sets the state of each receiver whose calibration a "DIAG:FLASH:CAT?" reply lists with a
// readable date (date first, "RCVRCHAR" and "\\" + calibration name fourth).
void applyCatalogReply(const std::string& reply, const std::vector<std::string>& receivers,
                       CatalogFindings& findings, std::chrono::system_clock::time_point now);

// The state a directory listing gives the named data file: its line's date (first field) when
// the line's size (fourth field) is not zero, else kCatalogNothing. Lines longer than 149
// characters end the reading.
int listingState(std::istream& listing, const std::string& fileName,
                 std::chrono::system_clock::time_point now);

}  // namespace storage
