#pragma once

// Windows-style paths stay as the system writes them (logs, commands); only file access
// goes through this map to a local file. "C:\..." maps under the root given for that drive
// letter; ".\x" and other relative paths map under the working directory.

#include <filesystem>
#include <map>
#include <string>

namespace platform {

class PathMap {
  public:
    virtual ~PathMap() = default;
    // Raises an error text naming the path when it cannot be mapped (an unknown drive).
    virtual std::filesystem::path toLocal(const std::string& windowsPath) const = 0;
};

class DrivePathMap final : public PathMap {
  public:
    explicit DrivePathMap(std::filesystem::path workingDirectory);
    // Drive letter (upper or lower case) to the local folder that stands in for its root.
    void mapDrive(char letter, std::filesystem::path root);
    std::filesystem::path toLocal(const std::string& windowsPath) const override;
    const std::filesystem::path& workingDirectory() const { return m_workingDirectory; }

  private:
    std::filesystem::path m_workingDirectory;
    std::map<char, std::filesystem::path> m_drives;
};

}  // namespace platform
