#pragma once

// One rcvrchar at a time per folder: an advisory lock (flock) on ".rcvrchar.lock" in the
// folder, held for the life of this object. The system drops it when the holder dies, so the
// file a crashed process leaves behind blocks nobody.

#include <filesystem>
#include <string>

namespace platform {

class FolderLock {
  public:
    static constexpr const char* kFileName = ".rcvrchar.lock";

    // Creates the folder if needed and takes its lock for `holder` (what this process does,
    // e.g. "the dialog"). Raises an error text naming the folder and, as far as the lock file
    // tells, the process that holds it, when another holds it or the lock cannot be taken.
    FolderLock(const std::filesystem::path& folder, const std::string& holder);
    ~FolderLock();
    FolderLock(const FolderLock&) = delete;
    FolderLock& operator=(const FolderLock&) = delete;

  private:
    int m_fd = -1;
};

}  // namespace platform
