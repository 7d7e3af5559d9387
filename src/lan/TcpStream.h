#pragma once

// A client's TCP connection with a deadline on every step, for the raw SCPI socket and the
// VXI-11 channels. Each step that does not finish in time closes the connection.

#include <asio.hpp>
#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

namespace lan {

class TcpStream {
  public:
    using Deadline = std::chrono::steady_clock::time_point;

    TcpStream() = default;
    TcpStream(const TcpStream&) = delete;
    TcpStream& operator=(const TcpStream&) = delete;

    // Resolves the host (a name, an IPv4 or an IPv6 address) and connects. Throws
    // ClientError: "cannot find the host ...", "connection refused", "no answer in 10 s".
    void connect(const std::string& host, std::uint16_t port, std::chrono::milliseconds timeout);
    bool isOpen() const { return m_socket.is_open(); }
    void close();
    // Throws ClientError; a stalled peer: "the instrument took no data for 10 s".
    void writeAll(std::string_view bytes, std::chrono::milliseconds timeout) {
        writeAll(bytes, {}, timeout);
    }
    // The two parts one after the other, without joining them first.
    void writeAll(std::string_view bytes, std::string_view more, std::chrono::milliseconds timeout);
    // Appends at least one byte that arrives before the deadline. Throws ClientError: "no
    // reply in <timeout>" (the timeout only names the wait), or "the instrument closed the
    // connection".
    void readSome(std::string& out, Deadline deadline, std::chrono::milliseconds timeout);
    // Bytes that have arrived and wait to be read.
    std::size_t available();

  private:
    // Runs the I/O until `done` or the deadline; false when the deadline passed.
    bool runUntil(const bool& done, Deadline deadline);

    asio::io_context m_io;
    asio::ip::tcp::socket m_socket{m_io};
    char m_chunk[64 * 1024];
};

}  // namespace lan
