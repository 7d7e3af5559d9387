#include "storage/DataFile.h"

#include <fstream>
#include <sstream>

#include "platform/DriveFiles.h"
#include "platform/WholeFile.h"

namespace storage {

void writeDataFile(const platform::PathMap& paths, const std::string& windowsPath,
                   std::string_view bytes) {
    if (auto* files = paths.driveFiles(windowsPath)) {
        files->write(windowsPath, bytes);
        return;
    }
    platform::writeWholeFile(paths.toLocal(windowsPath), bytes,
                             "the characterization data file " + windowsPath);
}

std::optional<std::string> readDataFile(const platform::PathMap& paths,
                                        const std::string& windowsPath) {
    if (auto* files = paths.driveFiles(windowsPath)) {
        return files->read(windowsPath);
    }
    std::ifstream in(paths.toLocal(windowsPath), std::ios::binary);
    if (!in) {
        return std::nullopt;
    }
    std::ostringstream content;
    content << in.rdbuf();
    return std::move(content).str();
}

}  // namespace storage
