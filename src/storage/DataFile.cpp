#include "storage/DataFile.h"

#include <fstream>
#include <sstream>

#include "platform/WholeFile.h"

namespace storage {

void writeDataFile(const platform::PathMap& paths, const std::string& windowsPath,
                   std::string_view bytes) {
    platform::writeWholeFile(paths.toLocal(windowsPath), bytes,
                             "the characterization data file " + windowsPath);
}

std::optional<std::string> readDataFile(const platform::PathMap& paths,
                                        const std::string& windowsPath) {
    std::ifstream in(paths.toLocal(windowsPath), std::ios::binary);
    if (!in) {
        return std::nullopt;
    }
    std::ostringstream content;
    content << in.rdbuf();
    return std::move(content).str();
}

}  // namespace storage
