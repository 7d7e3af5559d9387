#pragma once

// Whole-file access to the per-port data files, by their Windows-style paths.

#include <optional>
#include <string>
#include <string_view>

#include "platform/PathMap.h"

namespace storage {

// Writes the bytes to a temporary file beside the target and renames it over the target, so
// that a failed write never leaves a truncated file behind. Raises an error text naming the
// file and the reason when any step fails; the old file is then unchanged.
void writeDataFile(const platform::PathMap& paths, const std::string& windowsPath,
                   std::string_view bytes);

// The file's bytes, or nothing when it cannot be opened.
std::optional<std::string> readDataFile(const platform::PathMap& paths,
                                        const std::string& windowsPath);

}  // namespace storage
