#pragma once

// Finding out, at start-up, which receivers the analyzer already holds a characterization for
// and how old it is: from the flash catalog, or on millimetre-wave systems from a directory
// listing of each receiver's per-port data file.

#include <chrono>
#include <cstdint>
#include <istream>
#include <optional>
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

// What the catalog tells of one receiver's stored characterization.
struct CatalogEntry {
    std::string date;         // as the catalog or the listing writes it, time included
    std::uint64_t bytes = 0;  // size of the stored data
};

// The flash catalog's line for the receiver's calibration (exact name, any case), or on
// millimetre-wave systems the directory listing of its per-port data file (through
// "fileInfo.txt", as catalogFlash). Nothing when nothing is stored or the size is zero.
std::optional<CatalogEntry> catalogEntry(const StorageContext& context,
                                         platform::ProcessRunner& processes,
                                         const std::string& receiver);

}  // namespace storage
