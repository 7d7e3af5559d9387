#include "analyzer/remote/RawSocketTransport.h"

#include "lan/ClientError.h"

namespace remote {

RawSocketTransport::RawSocketTransport(const ResourceString& resource,
                                       std::chrono::milliseconds timeout)
    : m_resource(resource.text), m_timeout(timeout), m_client(resource.host, resource.port) {}

void RawSocketTransport::open() {
    if (m_client.isOpen() && !m_stale) {
        return;
    }
    m_client.close();
    try {
        m_client.connect(m_timeout);
    } catch (const lan::ClientError& error) {
        throw LinkFailure(error.what());
    }
    m_stale = false;
    ++m_connections;
}

void RawSocketTransport::send(std::string_view message) {
    try {
        m_client.send(message, m_timeout);
    } catch (const lan::ClientError& error) {
        m_stale = true;
        throw LinkFailure(error.what());
    }
}

std::string RawSocketTransport::read(std::chrono::milliseconds timeout) {
    try {
        return m_client.readResponse(timeout);
    } catch (const lan::ClientError& error) {
        m_stale = true;
        throw LinkFailure(error.what());
    }
}

}  // namespace remote
