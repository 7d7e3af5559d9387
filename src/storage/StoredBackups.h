#pragma once

// Saving what the analyzer holds for a receiver before it is erased or replaced, under
// "backups/<YYYYMMDD>-<HHMMSS>-<serial>/" in the working directory: the image as a data file,
// its export text and manifest.json. Used from the dialog's thread and from the worker, never
// at the same time; latest() may be read from either.

#include <filesystem>
#include <map>
#include <mutex>
#include <string>
#include <vector>

#include "platform/ProcessRunner.h"
#include "storage/StorageContext.h"

namespace storage {

enum class BackupReason { Erase, Overwrite, Restore };

class StoredBackups {
  public:
    // root: the local "backups" folder; processes list the per-port data files.
    StoredBackups(std::filesystem::path root, platform::ProcessRunner& processes);

    // Reads every listed receiver's stored characterization and saves them in one new folder,
    // which it returns; receivers with nothing stored are skipped, and when none has anything
    // no folder is made and the path is empty. Raises an error text naming the receiver, what
    // could not be read or written and why (the folder is then removed), so that the caller
    // erases or replaces nothing.
    std::filesystem::path save(const StorageContext& context,
                               const std::vector<std::string>& receivers, BackupReason reason);

    // The folder of the latest backup of each receiver saved through this object.
    std::map<std::string, std::filesystem::path> latest() const;
    const std::filesystem::path& root() const { return m_root; }

  private:
    std::filesystem::path m_root;
    platform::ProcessRunner& m_processes;
    mutable std::mutex m_mutex;
    std::map<std::string, std::filesystem::path> m_latest;
};

}  // namespace storage
