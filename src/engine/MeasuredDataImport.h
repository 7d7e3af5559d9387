#pragma once

// Reads back a raw export written by writeAllMeasuredData into a store whose band plan and
// power ladder are already in place, so stored measurements can be judged again offline.

#include <filesystem>

#include "engine/CompressionData.h"

namespace engine {

// The header must name one column triple per ladder level, and the frequency column must
// match the plan's measured frequencies as the file writes them (15 significant digits).
// Raises an error text naming the file, the line and what differs.
void readAllMeasuredData(CCompressionData& store, const std::filesystem::path& file);

}  // namespace engine
