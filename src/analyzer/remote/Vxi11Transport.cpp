#include "analyzer/remote/Vxi11Transport.h"

#include "lan/ClientError.h"

namespace remote {

Vxi11Transport::Vxi11Transport(const ResourceString& resource, std::chrono::milliseconds timeout,
                               std::uint16_t portmapperPort)
    : m_resource(resource.text),
      m_timeout(timeout),
      m_client(resource.host, resource.device, portmapperPort) {}

void Vxi11Transport::open() {
    if (m_client.isOpen() && !m_stale) {
        return;
    }
    if (m_client.isOpen()) {
        try {
            m_client.clear(m_timeout);
            m_stale = false;
            return;
        } catch (const lan::ClientError&) {
            // A device that cannot be cleared gets a new link.
        }
    }
    try {
        m_client.connect(m_timeout);
    } catch (const lan::ClientError& error) {
        throw LinkFailure(error.what());
    }
    m_stale = false;
    ++m_connections;
}

void Vxi11Transport::send(std::string_view message) {
    try {
        m_client.send(message, m_timeout);
    } catch (const lan::ClientError& error) {
        m_stale = true;
        throw LinkFailure(error.what());
    }
}

std::string Vxi11Transport::read(std::chrono::milliseconds timeout) {
    try {
        return m_client.readResponse(timeout);
    } catch (const lan::ClientError& error) {
        m_stale = true;
        throw LinkFailure(error.what());
    }
}

}  // namespace remote
