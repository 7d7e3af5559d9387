#pragma once

// Files of the analyzer computer that are reached through the instrument (an analyzer on
// the LAN), not through the local file system. Paths are the Windows form the analyzer
// computer uses.

#include <optional>
#include <string>
#include <string_view>

namespace platform {

class DriveFiles {
  public:
    virtual ~DriveFiles() = default;
    // Writes the whole file and checks what the analyzer then holds. Raises an error text
    // naming the file when it is not stored exactly.
    virtual void write(const std::string& windowsPath, std::string_view bytes) = 0;
    // The file's bytes, or nothing when there is no such file.
    virtual std::optional<std::string> read(const std::string& windowsPath) = 0;
};

}  // namespace platform
