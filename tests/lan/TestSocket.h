#pragma once

// Blocking loopback sockets for the tests, with timeouts so that a server fault fails a
// test instead of hanging it.

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

namespace lantest {

using namespace std::chrono_literals;

class TestSocket {
  public:
    explicit TestSocket(std::uint16_t port);  // TCP to 127.0.0.1
    ~TestSocket();
    TestSocket(TestSocket&& other) noexcept;
    TestSocket(const TestSocket&) = delete;
    TestSocket& operator=(const TestSocket&) = delete;

    void send(std::string_view bytes);
    // Exactly `count` bytes; throws when they do not come in time.
    std::string receive(std::size_t count, std::chrono::milliseconds timeout = 5s);
    // Up to the next NL, which is removed; throws when none comes in time.
    std::string line(std::chrono::milliseconds timeout = 5s);
    // Whether anything at all arrives within `timeout` (the bytes are kept for later reads).
    bool anythingWithin(std::chrono::milliseconds timeout);
    // Whether the peer closes within `timeout`, discarding what arrives meanwhile.
    bool closedWithin(std::chrono::milliseconds timeout);
    void close();

  private:
    // Reads once into the buffer; false on a timeout; throws when the peer closed.
    bool fill(std::chrono::steady_clock::time_point deadline);

    int m_fd = -1;
    std::string m_buffered;
};

// One datagram to 127.0.0.1:port and the answer to it.
std::string udpExchange(std::uint16_t port, std::string_view datagram,
                        std::chrono::milliseconds timeout = 5s);

}  // namespace lantest
