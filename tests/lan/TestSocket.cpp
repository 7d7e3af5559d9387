#include "TestSocket.h"

#include <arpa/inet.h>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <utility>

namespace lantest {

namespace {

sockaddr_in loopback(std::uint16_t port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(port);
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    return address;
}

int remainingMs(std::chrono::steady_clock::time_point deadline) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
        deadline - std::chrono::steady_clock::now());
    return left.count() < 0 ? 0 : static_cast<int>(left.count());
}

bool readable(int fd, std::chrono::steady_clock::time_point deadline) {
    pollfd entry{fd, POLLIN, 0};
    return ::poll(&entry, 1, remainingMs(deadline)) > 0;
}

}  // namespace

TestSocket::TestSocket(std::uint16_t port) : m_fd(::socket(AF_INET, SOCK_STREAM, 0)) {
    const sockaddr_in address = loopback(port);
    if (m_fd < 0 ||
        ::connect(m_fd, reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0) {
        const std::string reason = std::strerror(errno);
        close();
        throw std::runtime_error("cannot connect to 127.0.0.1:" + std::to_string(port) + ": " +
                                 reason);
    }
    const int one = 1;
    ::setsockopt(m_fd, IPPROTO_TCP, TCP_NODELAY, &one, sizeof one);
}

TestSocket::~TestSocket() {
    close();
}

TestSocket::TestSocket(TestSocket&& other) noexcept
    : m_fd(std::exchange(other.m_fd, -1)), m_buffered(std::move(other.m_buffered)) {}

void TestSocket::send(std::string_view bytes) {
    while (!bytes.empty()) {
        const auto sent = ::send(m_fd, bytes.data(), bytes.size(), MSG_NOSIGNAL);
        if (sent < 0) {
            throw std::runtime_error(std::string("send failed: ") + std::strerror(errno));
        }
        bytes.remove_prefix(static_cast<std::size_t>(sent));
    }
}

bool TestSocket::fill(std::chrono::steady_clock::time_point deadline) {
    if (!readable(m_fd, deadline)) {
        return false;
    }
    char chunk[65536];
    const auto got = ::recv(m_fd, chunk, sizeof chunk, 0);
    if (got <= 0) {
        throw std::runtime_error("connection closed by the server");
    }
    m_buffered.append(chunk, static_cast<std::size_t>(got));
    return true;
}

std::string TestSocket::receive(std::size_t count, std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    while (m_buffered.size() < count) {
        if (!fill(deadline)) {
            throw std::runtime_error("timed out with " + std::to_string(m_buffered.size()) +
                                     " of " + std::to_string(count) + " bytes");
        }
    }
    std::string bytes = m_buffered.substr(0, count);
    m_buffered.erase(0, count);
    return bytes;
}

std::string TestSocket::line(std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    std::size_t scanned = 0;
    for (;;) {
        if (const auto end = m_buffered.find('\n', scanned); end != std::string::npos) {
            std::string text = m_buffered.substr(0, end);
            m_buffered.erase(0, end + 1);
            return text;
        }
        scanned = m_buffered.size();
        if (!fill(deadline)) {
            throw std::runtime_error("timed out waiting for a line; got \"" + m_buffered + "\"");
        }
    }
}

bool TestSocket::anythingWithin(std::chrono::milliseconds timeout) {
    return !m_buffered.empty() || fill(std::chrono::steady_clock::now() + timeout);
}

bool TestSocket::closedWithin(std::chrono::milliseconds timeout) {
    const auto deadline = std::chrono::steady_clock::now() + timeout;
    try {
        while (fill(deadline)) {
            m_buffered.clear();
        }
        return false;
    } catch (const std::runtime_error&) {
        return true;
    }
}

void TestSocket::close() {
    if (m_fd >= 0) {
        ::close(m_fd);
        m_fd = -1;
    }
}

std::string udpExchange(std::uint16_t port, std::string_view datagram,
                        std::chrono::milliseconds timeout) {
    const int fd = ::socket(AF_INET, SOCK_DGRAM, 0);
    const sockaddr_in address = loopback(port);
    ::sendto(fd, datagram.data(), datagram.size(), 0, reinterpret_cast<const sockaddr*>(&address),
             sizeof address);
    std::string answer;
    if (readable(fd, std::chrono::steady_clock::now() + timeout)) {
        char buffer[65536];
        const auto got = ::recv(fd, buffer, sizeof buffer, 0);
        if (got > 0) {
            answer.assign(buffer, static_cast<std::size_t>(got));
        }
    }
    ::close(fd);
    if (answer.empty()) {
        throw std::runtime_error("no UDP answer from 127.0.0.1:" + std::to_string(port));
    }
    return answer;
}

}  // namespace lantest
