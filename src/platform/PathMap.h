#pragma once

// Windows-style paths stay as the system writes them (logs, commands); only file access
// goes through this map to a local file. "C:\..." maps under the root given for that drive
// letter; ".\x" and other relative paths map under the working directory.

#include <filesystem>
#include <map>
#include <string>

#include "platform/DriveFiles.h"

namespace platform {

class PathMap {
  public:
    virtual ~PathMap() = default;
    // Raises an error text naming the path when it cannot be mapped (an unknown drive).
    virtual std::filesystem::path toLocal(const std::string& windowsPath) const = 0;
    // The instrument's file service when the path lies on a drive reached through it;
    // nullptr when the path maps to a local file.
    virtual DriveFiles* driveFiles(const std::string&) const { return nullptr; }
};

class DrivePathMap final : public PathMap {
  public:
    explicit DrivePathMap(std::filesystem::path workingDirectory);
    // Drive letter (upper or lower case) to the local folder that stands in for its root.
    void mapDrive(char letter, std::filesystem::path root);
    // The drive lives on the analyzer computer and is reached through the instrument; the
    // files must outlive the map. toLocal refuses its paths.
    void mapDrive(char letter, DriveFiles& files);
    std::filesystem::path toLocal(const std::string& windowsPath) const override;
    DriveFiles* driveFiles(const std::string& windowsPath) const override;
    const std::filesystem::path& workingDirectory() const { return m_workingDirectory; }

  private:
    std::filesystem::path m_workingDirectory;
    std::map<char, std::filesystem::path> m_drives;
    std::map<char, DriveFiles*> m_remoteDrives;
};

}  // namespace platform
