#pragma once

// SCPI over a plain TCP stream (port 5025 on analyzers): each connection is one session,
// its input framed into program messages, each response written whole with an NL after it.

#include <asio.hpp>
#include <chrono>
#include <cstdint>

#include "lan/LinkFaults.h"
#include "lan/TcpListener.h"
#include "scpi/Block.h"
#include "scpi/Device.h"

namespace lan {

class RawSocketServer {
  public:
    struct Options {
        // Input that is a whole message but lacks its NL runs after this much silence.
        std::chrono::milliseconds idleGap{200};
        std::size_t maxMessageBytes = scpi::maxBlockBytes + (1u << 20);
        // Faults to show on purpose; it must outlive the server.
        LinkFaults* faults = nullptr;
    };

    // Throws std::runtime_error naming the address when it cannot listen there.
    RawSocketServer(ServerContext& context, scpi::Device& device,
                    const asio::ip::tcp::endpoint& endpoint, Options options);
    RawSocketServer(ServerContext& context, scpi::Device& device,
                    const asio::ip::tcp::endpoint& endpoint)
        : RawSocketServer(context, device, endpoint, Options{}) {}

    std::uint16_t port() const { return m_listener.port(); }

  private:
    class RawConnection;

    ServerContext& m_context;
    scpi::Device& m_device;
    Options m_options;
    TcpListener m_listener;
};

}  // namespace lan
