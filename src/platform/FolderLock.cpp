#include "platform/FolderLock.h"

#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace platform {
namespace {

// The holder line the lock file keeps, without its line end; empty when it cannot be read.
std::string holderOf(int fd) {
    char text[256];
    const ssize_t size = ::pread(fd, text, sizeof text - 1, 0);
    if (size <= 0) {
        return {};
    }
    std::string line(text, static_cast<std::size_t>(size));
    return line.substr(0, line.find('\n'));
}

}  // namespace

FolderLock::FolderLock(const std::filesystem::path& folder, const std::string& holder) {
    std::error_code ec;
    std::filesystem::create_directories(folder, ec);
    const auto path = folder / kFileName;
    m_fd = ::open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0644);
    if (m_fd < 0) {
        throw std::string("Cannot lock the folder " + folder.string() + " (" + path.string() +
                          "): " + std::strerror(errno));
    }
    if (::flock(m_fd, LOCK_EX | LOCK_NB) != 0) {
        const int error = errno;
        const std::string other = holderOf(m_fd);
        ::close(m_fd);
        m_fd = -1;
        if (error == EWOULDBLOCK) {
            throw std::string("The folder " + folder.string() + " is in use by another rcvrchar" +
                              (other.empty() ? std::string() : " (" + other + ")") +
                              "; wait until it has ended, or use another folder");
        }
        throw std::string("Cannot lock the folder " + folder.string() + " (" + path.string() +
                          "): " + std::strerror(error));
    }
    // Without the note the lock still holds; a refused process only cannot name the holder.
    const std::string line = holder + ", process " + std::to_string(::getpid()) + "\n";
    [[maybe_unused]] const bool noted =
        ::ftruncate(m_fd, 0) == 0 &&
        ::pwrite(m_fd, line.data(), line.size(), 0) == static_cast<ssize_t>(line.size());
}

FolderLock::~FolderLock() {
    if (m_fd >= 0) {
        // Emptied, not removed: removing a lock file lets two processes lock two files of one
        // name. Empty, the file is the same after every run.
        [[maybe_unused]] const bool emptied = ::ftruncate(m_fd, 0) == 0;
        ::close(m_fd);
    }
}

}  // namespace platform
