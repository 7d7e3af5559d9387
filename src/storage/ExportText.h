#pragma once

// The readable text form of a stored characterization: header lines, then one line per record
// with the frequency and a (power,value,phase) triple per compression level.

#include <ostream>

#include "storage/RcvrCharImage.h"

namespace storage {

// Writes the header lines and, when the image holds every record it announces, the records.
// Returns false when only the header was written. The image must hold a header.
bool writeExportText(std::ostream& out, const RcvrCharImage& image);

}  // namespace storage
