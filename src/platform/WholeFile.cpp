#include "platform/WholeFile.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace platform {

std::filesystem::path WholeFile::partialPath(const std::filesystem::path& target) {
    auto partial = target;
    partial += ".partial";
    return partial;
}

WholeFile::WholeFile(std::filesystem::path target, std::string what)
    : m_target(std::move(target)), m_partial(partialPath(m_target)), m_what(std::move(what)) {
    m_file.reset(std::fopen(m_partial.c_str(), "wb"));
    if (!m_file) {
        fail(std::strerror(errno));
    }
}

WholeFile::~WholeFile() {
    if (!m_committed) {
        m_file.reset();
        std::error_code ignored;
        std::filesystem::remove(m_partial, ignored);
    }
}

void WholeFile::fail(const std::string& reason) {
    m_file.reset();
    std::error_code ignored;
    std::filesystem::remove(m_partial, ignored);
    m_committed = true;  // nothing left to clean up
    throw std::string("Cannot write " + m_what + " (" + m_target.string() + "): " + reason +
                      "; any earlier file of that name is left as it was");
}

void WholeFile::write(std::string_view bytes) {
    if (!m_file) {
        fail("the file was already closed");
    }
    if (std::fwrite(bytes.data(), 1, bytes.size(), m_file.get()) != bytes.size()) {
        fail(std::strerror(errno));
    }
}

void WholeFile::commit() {
    if (!m_file) {
        fail("the file was already closed");
    }
    if (std::fflush(m_file.get()) != 0 || ::fsync(::fileno(m_file.get())) != 0) {
        fail(std::strerror(errno));
    }
    if (std::fclose(m_file.release()) != 0) {
        fail(std::strerror(errno));
    }
    std::error_code ec;
    std::filesystem::rename(m_partial, m_target, ec);
    if (ec) {
        fail(ec.message());
    }
    m_committed = true;
}

void writeWholeFile(const std::filesystem::path& target, std::string_view bytes,
                    const std::string& what) {
    WholeFile file(target, what);
    file.write(bytes);
    file.commit();
}

}  // namespace platform
