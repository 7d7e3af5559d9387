#include "sim/Transcript.h"

namespace sim {

void Transcript::record(char kind, std::string_view text) {
    std::string line;
    line += kind;
    line += ' ';
    if (text.size() > maxLineLength) {
        line.append(text.substr(0, maxLineLength));
        line += "... [" + std::to_string(text.size()) + " characters]";
    } else {
        line += text;
    }
    std::lock_guard lock(m_mutex);
    if (m_file.is_open()) {
        m_file << line << '\n';
        m_file.flush();
    }
    m_lines.push_back(std::move(line));
}

std::vector<std::string> Transcript::lines() const {
    std::lock_guard lock(m_mutex);
    return m_lines;
}

void Transcript::clear() {
    std::lock_guard lock(m_mutex);
    m_lines.clear();
}

void Transcript::setFile(const std::filesystem::path& path) {
    std::lock_guard lock(m_mutex);
    m_file.close();
    m_file.open(path, std::ios::out | std::ios::trunc);
    if (!m_file) {
        throw std::string("cannot open trace file " + path.string());
    }
}

}  // namespace sim
