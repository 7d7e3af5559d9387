#pragma once

// The analyzer computer's drive through the instrument's file commands: a file goes out with
// MMEM:TRAN and is read back with MMEM:TRAN? and compared, listings come from MMEM:CAT?,
// deletion is MMEM:DEL. A file is looked up in its folder's listing before it is read or
// deleted, so that a missing file leaves no error in the instrument's queue.

#include <optional>
#include <string>

#include "analyzer/remote/ScpiLink.h"
#include "platform/DriveFiles.h"

namespace remote {

struct DriveEntry {
    std::string name;
    unsigned long long size = 0;
    std::string modified;  // "MM/DD/YYYY HH:MM:SS", the analyzer computer's local time
};

class RemoteDrive final : public platform::DriveFiles {
  public:
    explicit RemoteDrive(std::shared_ptr<ScpiLink> link) : m_link(std::move(link)) {}

    void write(const std::string& windowsPath, std::string_view bytes) override;
    std::optional<std::string> read(const std::string& windowsPath) override;
    // The file's entry in its folder's listing; nothing when there is no such file.
    std::optional<DriveEntry> find(const std::string& windowsPath);
    // True when the file existed and was deleted.
    bool remove(const std::string& windowsPath);

  private:
    std::string transfer(const std::string& windowsPath, const std::string& doing);

    std::shared_ptr<ScpiLink> m_link;
};

// "C:\a\b.dat" -> "C:\a" and "b.dat".
std::pair<std::string, std::string> splitWindowsPath(const std::string& windowsPath);

}  // namespace remote
