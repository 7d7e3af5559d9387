#include "storage/FlashCommandLog.h"

#include <cerrno>
#include <cstring>
#include <fstream>

namespace storage {

FlashCommandLog::FlashCommandLog(const platform::PathMap& paths) : m_paths(paths) {}

void FlashCommandLog::create() {
    std::lock_guard lock(m_mutex);
    auto local = m_paths.toLocal(kWindowsPath);
    std::ofstream out(local, std::ios::binary | std::ios::trunc);
    out << "Initialized file\r\n";
    out.close();
    if (!out) {
        throw std::string("Cannot create the flash command log ") + kWindowsPath + " (" +
            local.string() + "): " + std::strerror(errno);
    }
}

void FlashCommandLog::append(const std::string& line) {
    std::lock_guard lock(m_mutex);
    std::ofstream out(m_paths.toLocal(kWindowsPath), std::ios::binary | std::ios::app);
    out << line << "\r\n";
}

}  // namespace storage
