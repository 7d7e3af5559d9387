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
    // Written as a text-mode file is on the analyzer's computer: every line feed, also those
    // between the error texts of one entry, becomes CR LF.
    std::string text;
    text.reserve(line.size() + 2);
    for (char c : line) {
        if (c == '\n') {
            text += '\r';
        }
        text += c;
    }
    out << text << "\r\n";
}

}  // namespace storage
