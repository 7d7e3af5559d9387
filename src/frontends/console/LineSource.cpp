#include "frontends/console/LineSource.h"

#include <poll.h>
#include <unistd.h>

#include <cerrno>

namespace console {

std::optional<std::string> FdLineSource::takeLine() {
    const auto end = m_buffer.find('\n');
    if (end == std::string::npos) {
        if (m_eof && !m_buffer.empty()) {
            std::string last;
            last.swap(m_buffer);
            return last;
        }
        return std::nullopt;
    }
    std::string line = m_buffer.substr(0, end);
    m_buffer.erase(0, end + 1);
    if (!line.empty() && line.back() == '\r') {
        line.pop_back();
    }
    return line;
}

std::optional<std::string> FdLineSource::poll(std::chrono::milliseconds timeout) {
    if (auto line = takeLine()) {
        return line;
    }
    if (m_eof) {
        return std::nullopt;
    }
    pollfd request{m_fd, POLLIN, 0};
    const int ready = ::poll(&request, 1, static_cast<int>(timeout.count()));
    if (ready <= 0) {
        return std::nullopt;
    }
    char chunk[512];
    const ssize_t got = ::read(m_fd, chunk, sizeof chunk);
    if (got > 0) {
        m_buffer.append(chunk, static_cast<std::size_t>(got));
    } else if (got == 0 || errno != EINTR) {
        m_eof = true;
    }
    return takeLine();
}

}  // namespace console
