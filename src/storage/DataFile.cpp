#include "storage/DataFile.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <memory>
#include <sstream>

namespace storage {
namespace {

struct FileCloser {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

std::string failure(const std::string& windowsPath, const std::filesystem::path& local,
                    const std::string& reason) {
    return "Cannot write the characterization data file " + windowsPath + " (" + local.string() +
           "): " + reason;
}

// Writes and flushes the whole file to the disk; returns the reason of a failure, or empty.
std::string writeWhole(const std::filesystem::path& path, std::string_view bytes) {
    std::unique_ptr<std::FILE, FileCloser> file(std::fopen(path.c_str(), "wb"));
    if (!file) {
        return std::strerror(errno);
    }
    if (std::fwrite(bytes.data(), 1, bytes.size(), file.get()) != bytes.size() ||
        std::fflush(file.get()) != 0 || ::fsync(::fileno(file.get())) != 0) {
        return std::strerror(errno);
    }
    if (std::fclose(file.release()) != 0) {
        return std::strerror(errno);
    }
    return {};
}

}  // namespace

void writeDataFile(const platform::PathMap& paths, const std::string& windowsPath,
                   std::string_view bytes) {
    if (auto* files = paths.driveFiles(windowsPath)) {
        files->write(windowsPath, bytes);
        return;
    }
    auto local = paths.toLocal(windowsPath);
    auto temporary = local;
    temporary += ".partial";
    if (std::string reason = writeWhole(temporary, bytes); !reason.empty()) {
        std::error_code ignored;
        std::filesystem::remove(temporary, ignored);
        throw failure(windowsPath, local, reason);
    }
    std::error_code ec;
    std::filesystem::rename(temporary, local, ec);
    if (ec) {
        std::error_code ignored;
        std::filesystem::remove(temporary, ignored);
        throw failure(windowsPath, local, ec.message());
    }
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
