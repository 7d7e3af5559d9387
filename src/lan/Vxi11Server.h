#pragma once

// A VXI-11 instrument: the core channel (links, writes, reads, status, clear, locks) and the
// abort channel, each on its own TCP port. Link state lives on one strand; the session calls
// go to the context's execution thread, so an abort is answered while a core call waits.

#include <asio.hpp>
#include <cstdint>
#include <memory>
#include <unordered_map>
#include <unordered_set>

#include "lan/RpcTcpServer.h"
#include "lan/Vxi11Link.h"
#include "lan/WaitingCalls.h"
#include "scpi/Block.h"
#include "scpi/Device.h"

namespace lan {

class Vxi11Server {
  public:
    struct Options {
        std::uint16_t corePort = 0;   // 0: a free port
        std::uint16_t abortPort = 0;  // 0: a free port
        // Advertised to clients; larger writes are taken too.
        std::uint32_t maxReceiveSize = 1u << 20;
        std::size_t maxMessageBytes = scpi::maxBlockBytes + (1u << 20);
        std::size_t maxLinks = 32;
    };

    // Throws std::runtime_error naming the address when it cannot listen there.
    Vxi11Server(ServerContext& context, scpi::Device& device, const asio::ip::address& address,
                Options options);
    Vxi11Server(ServerContext& context, scpi::Device& device, const asio::ip::address& address)
        : Vxi11Server(context, device, address, Options{}) {}

    std::uint16_t corePort() const { return m_core.port(); }
    std::uint16_t abortPort() const { return m_abort.port(); }

  private:
    using Reply = RpcTcpServer::Reply;
    using ConnectionId = RpcTcpServer::ConnectionId;

    void handleCore(ConnectionId connection, const rpc::Call& call, XdrReader& arguments,
                    Reply reply);
    void handleAbort(const rpc::Call& call, XdrReader& arguments, Reply reply);

    void createLink(ConnectionId connection, std::uint32_t xid, bool lock,
                    std::uint32_t lockTimeout, std::string device, Reply reply);
    void write(std::uint32_t xid, std::uint32_t link, std::uint32_t ioTimeout,
               std::uint32_t lockTimeout, std::uint32_t flags, std::string data, Reply reply);
    void read(std::uint32_t xid, std::uint32_t link, std::uint32_t requestSize,
              std::uint32_t ioTimeout, std::uint32_t lockTimeout, std::uint32_t flags,
              std::uint32_t termChar, Reply reply);
    // Read status, trigger, clear, remote and local, once the link may act.
    void generic(std::uint32_t xid, std::uint32_t procedure, Vxi11Link& link, const Reply& reply);
    void lock(std::uint32_t xid, std::uint32_t link, std::uint32_t flags, std::uint32_t lockTimeout,
              const Reply& reply);
    // Runs `answer` once the device is not locked by another link; answers error 11 when
    // it stays locked past the lock timeout (at once without the waitlock flag). `zeros`
    // shapes the failure reply as the procedure's result.
    void whenUnlocked(std::uint32_t xid, std::uint32_t link, std::uint32_t flags,
                      std::uint32_t lockTimeout, int zeros, const Reply& reply,
                      std::function<void(Vxi11Link&)> answer);
    void destroy(std::uint32_t link);
    void connectionClosed(ConnectionId connection);
    // Starts the link's next message on the execution thread when none is running.
    void run(const std::shared_ptr<Vxi11Link>& link);

    Vxi11Link* find(std::uint32_t link);
    std::shared_ptr<Vxi11Link> findShared(std::uint32_t link);
    bool lockedByOther(std::uint32_t link) const {
        return m_lockHolder != 0 && m_lockHolder != link;
    }

    ServerContext& m_context;
    scpi::Device& m_device;
    Options m_options;
    asio::strand<asio::io_context::executor_type> m_state;
    WaitingCalls m_waiting;
    std::unordered_map<std::uint32_t, std::shared_ptr<Vxi11Link>> m_links;
    std::uint32_t m_nextLink = 1;
    std::uint32_t m_lockHolder = 0;
    std::size_t m_linksOpening = 0;
    // Core connections that asked for a link and are still open.
    std::unordered_set<ConnectionId> m_connections;
    RpcTcpServer m_abort;
    RpcTcpServer m_core;
};

}  // namespace lan
