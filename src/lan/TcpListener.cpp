#include "lan/TcpListener.h"

#include <algorithm>
#include <chrono>
#include <stdexcept>

namespace lan {

std::string endpointText(const asio::ip::tcp::endpoint& endpoint) {
    return endpoint.address().to_string() + ":" + std::to_string(endpoint.port());
}

TcpListener::TcpListener(ServerContext& context, const asio::ip::tcp::endpoint& endpoint,
                         Start start)
    : m_context(context),
      m_start(std::move(start)),
      m_strand(asio::make_strand(context.io())),
      m_acceptor(m_strand),
      m_retry(m_strand) {
    try {
        m_acceptor.open(endpoint.protocol());
        m_acceptor.set_option(asio::socket_base::reuse_address(true));
        m_acceptor.bind(endpoint);
        m_acceptor.listen();
    } catch (const std::system_error& e) {
        throw std::runtime_error("cannot listen on TCP " + endpointText(endpoint) + ": " +
                                 e.code().message());
    }
    m_port = m_acceptor.local_endpoint().port();
    m_closer = m_context.addCloser([this] { closeAll(); });
    asio::dispatch(m_strand, [this] { accept(); });
}

TcpListener::~TcpListener() {
    m_context.stop();
    m_context.removeCloser(m_closer);
}

void TcpListener::accept() {
    m_acceptor.async_accept(asio::make_strand(m_context.io()),
                            [this](std::error_code error, asio::ip::tcp::socket socket) {
                                if (error == asio::error::operation_aborted) {
                                    return;
                                }
                                if (error) {
                                    // Out of descriptors, say: try again shortly rather than spin.
                                    m_retry.expires_after(std::chrono::milliseconds(50));
                                    m_retry.async_wait([this](std::error_code e) {
                                        if (!e) {
                                            accept();
                                        }
                                    });
                                    return;
                                }
                                std::error_code ignored;
                                socket.set_option(asio::ip::tcp::no_delay(true), ignored);
                                if (m_connections.size() >= m_pruneAt) {
                                    std::erase_if(m_connections,
                                                  [](const auto& c) { return c.expired(); });
                                    m_pruneAt = std::max<std::size_t>(16, 2 * m_connections.size());
                                }
                                m_connections.push_back(m_start(std::move(socket)));
                                accept();
                            });
}

void TcpListener::closeAll() {
    std::error_code ignored;
    m_acceptor.close(ignored);
    m_retry.cancel();
    for (auto& weak : m_connections) {
        if (auto connection = weak.lock()) {
            connection->close();
        }
    }
}

}  // namespace lan
