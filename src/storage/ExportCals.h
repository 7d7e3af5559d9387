#pragma once

// Writing every stored characterization into a readable text file
// "RcvrChar_" + flash name + "_Exported.txt" in the working directory.

#include <string>
#include <vector>

#include "storage/CatalogFindings.h"
#include "storage/StorageContext.h"

namespace storage {

// Asks the operator first ("Export calibration?"); anything but Yes writes nothing.
void exportCals(const StorageContext& context, const std::vector<std::string>& receivers,
                const CatalogFindings& findings);

// Exports, in list order, every receiver whose catalog state is not kCatalogNothing. The first
// image without a header, or without all its announced records, ends the export (the latter
// after its header lines are written). Returns the names of the files written. A file that
// cannot be written raises an error text naming it.
std::vector<std::string> exportStoredCals(const StorageContext& context,
                                          const std::vector<std::string>& receivers,
                                          const CatalogFindings& findings);

}  // namespace storage
