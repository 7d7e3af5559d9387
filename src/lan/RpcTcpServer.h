#pragma once

// One ONC RPC program served over TCP with record marking. Each connection reads one call,
// hands it to the handler and reads the next only after the reply went out, so a client
// that streams calls without reading replies is held back by TCP, not by our memory.

#include <asio.hpp>
#include <atomic>
#include <cstdint>
#include <functional>
#include <string>

#include "lan/OncRpc.h"
#include "lan/TcpListener.h"

namespace lan {

class RpcTcpServer {
  public:
    using ConnectionId = std::uint64_t;
    // Takes a record begun with rpc::beginReply; callable once, from any thread.
    using Reply = std::function<void(std::string record)>;
    // Runs on the connection's strand. A ProtocolError it throws while reading the
    // arguments is answered with GARBAGE_ARGS.
    using Handler =
        std::function<void(ConnectionId, const rpc::Call&, XdrReader& arguments, Reply)>;

    struct Program {
        std::uint32_t number = 0;
        std::uint32_t version = 0;
        std::size_t maxRecordBytes = 0;
    };

    // `closed` runs on a connection's strand when its peer goes away or breaks the protocol.
    RpcTcpServer(ServerContext& context, const asio::ip::tcp::endpoint& endpoint, Program program,
                 Handler handler, std::function<void(ConnectionId)> closed = {});

    std::uint16_t port() const { return m_listener.port(); }

  private:
    class RpcConnection;

    Program m_program;
    Handler m_handler;
    std::function<void(ConnectionId)> m_closed;
    std::atomic<ConnectionId> m_nextId{1};
    TcpListener m_listener;
};

}  // namespace lan
