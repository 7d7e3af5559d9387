#pragma once

// The small portmapper a VXI-11 server needs: program 100000 version 2, NULL and GETPORT,
// over TCP and UDP on one port. Clients ask it for the core channel's port before they
// connect; broadcast discovery asks it over UDP.

#include <array>
#include <asio.hpp>
#include <cstdint>
#include <vector>

#include "lan/RpcTcpServer.h"

namespace lan {

class Portmapper {
  public:
    struct Mapping {
        std::uint32_t program = 0;
        std::uint32_t version = 0;
        std::uint32_t protocol = rpc::protocolTcp;
        std::uint16_t port = 0;
    };

    // Listens on `address`:`port` (0: a free port, the same for TCP and UDP).
    Portmapper(ServerContext& context, const asio::ip::address& address, std::uint16_t port,
               std::vector<Mapping> mappings);
    ~Portmapper();

    std::uint16_t port() const { return m_tcp.port(); }

  private:
    void answer(const rpc::Call& call, XdrReader& arguments, const RpcTcpServer::Reply& reply);
    void receive();

    ServerContext& m_context;
    std::vector<Mapping> m_mappings;
    RpcTcpServer m_tcp;
    asio::ip::udp::socket m_udp;
    asio::ip::udp::endpoint m_sender;
    std::array<char, 8192> m_datagram{};
    ServerContext::Closer m_closer;
};

}  // namespace lan
