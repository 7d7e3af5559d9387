#pragma once

// The client end of a raw SCPI socket (port 5025 on analyzers): messages go out with NL,
// responses come back one at a time, ended by NL; a definite-length block is read by its
// length, so its bytes may hold NL. The caller has at most one query outstanding, so every
// byte that arrives belongs to the response being read: a reply whose text spans lines
// (written whole by the instrument) is taken whole while its bytes keep arriving.
//
// A raw socket has no device clear: after any failure the caller must reconnect before the
// next message, or a late reply would answer the next query.

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

#include "lan/TcpStream.h"

namespace lan {

class RawSocketClient {
  public:
    RawSocketClient(std::string host, std::uint16_t port) : m_host(std::move(host)), m_port(port) {}

    // Throws ClientError.
    void connect(std::chrono::milliseconds timeout);
    bool isOpen() const { return m_stream.isOpen(); }
    void close() { m_stream.close(); }
    void send(std::string_view message, std::chrono::milliseconds timeout);
    // One response without its terminator. Throws ClientError; the connection is then
    // closed.
    std::string readResponse(std::chrono::milliseconds timeout);

  private:
    [[noreturn]] void garbage(const std::string& why);

    std::string m_host;
    std::uint16_t m_port;
    TcpStream m_stream;
    std::string m_buffer;
};

}  // namespace lan
