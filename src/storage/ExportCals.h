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

struct ExportResult {
    std::vector<std::string> files;  // names of the files written, in order
    std::string endedAt;             // the receiver whose image ended the export, if one did
    std::string reason;              // what was wrong with that image
};

// Exports, in list order, every receiver whose catalog state is not kCatalogNothing. The first
// image without a header, or without all its announced records, ends the export (the latter
// after its header lines are written). A file that cannot be written raises an error text
// naming it.
ExportResult exportStoredCals(const StorageContext& context,
                              const std::vector<std::string>& receivers,
                              const CatalogFindings& findings);

}  // namespace storage
