#pragma once

// Accepts TCP connections for one server and keeps weak references to them, so that the
// context's stop can close every socket.

#include <asio.hpp>
#include <functional>
#include <memory>
#include <vector>

#include "lan/ServerContext.h"

namespace lan {

class Connection {
  public:
    virtual ~Connection() = default;
    // Called only once the context's I/O threads have stopped.
    virtual void close() = 0;
};

class TcpListener {
  public:
    using Start = std::function<std::shared_ptr<Connection>(asio::ip::tcp::socket socket)>;

    // Throws std::runtime_error naming the address when it cannot listen there.
    TcpListener(ServerContext& context, const asio::ip::tcp::endpoint& endpoint, Start start);
    ~TcpListener();
    TcpListener(const TcpListener&) = delete;
    TcpListener& operator=(const TcpListener&) = delete;

    std::uint16_t port() const { return m_port; }

  private:
    void accept();
    void closeAll();

    ServerContext& m_context;
    Start m_start;
    asio::strand<asio::io_context::executor_type> m_strand;
    asio::ip::tcp::acceptor m_acceptor;
    asio::steady_timer m_retry;
    std::uint16_t m_port = 0;
    std::vector<std::weak_ptr<Connection>> m_connections;
    std::size_t m_pruneAt = 16;
    ServerContext::Closer m_closer;
};

// "address:port" for messages.
std::string endpointText(const asio::ip::tcp::endpoint& endpoint);

}  // namespace lan
