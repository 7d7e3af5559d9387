#pragma once

// What the analyzer holds for each receiver: read from the catalog at start-up, then updated
// by the worker and by erasing. Keyed by the receiver name of the dialog's list.

#include <map>
#include <string>

namespace storage {

enum CatalogState : int {
    kCatalogOld = -1,           // stored, dated more than 7 days ago
    kCatalogNothing = 0,        // nothing dated found
    kCatalogRecent = 1,         // stored, dated at most 7 days ago
    kCatalogCharacterized = 2,  // characterized since start-up
    kCatalogErased = 3,         // erased since start-up
};

using CatalogFindings = std::map<std::string, int>;

}  // namespace storage
