#include "DeviceTransport.h"

namespace testsupport {

DeviceTransport::DeviceTransport(scpi::Device& device, std::string resource)
    : m_device(device), m_resource(std::move(resource)) {}

void DeviceTransport::open() {
    if (m_session && !m_stale) {
        return;
    }
    // As a socket client reconnects: a fresh session, nothing left of the old one's replies.
    m_session = m_device.openSession();
    m_replies.clear();
    m_stale = false;
    ++m_connections;
}

void DeviceTransport::send(std::string_view message) {
    try {
        if (beforeSend) {
            beforeSend(message);
        }
    } catch (const remote::LinkFailure&) {
        m_stale = true;
        throw;
    }
    std::string reply = m_session->execute(message);
    if (!reply.empty()) {
        m_replies.push_back(std::move(reply));
    }
}

std::string DeviceTransport::read(std::chrono::milliseconds timeout) {
    if (m_replies.empty()) {
        m_stale = true;
        throw remote::LinkFailure("no reply in " + std::to_string(timeout.count() / 1000) + " s");
    }
    std::string reply = std::move(m_replies.front());
    m_replies.pop_front();
    try {
        if (beforeReply) {
            beforeReply(reply);
        }
    } catch (const remote::LinkFailure&) {
        m_stale = true;
        throw;
    }
    return reply;
}

void DeviceTransport::abandonReply() {
    m_stale = true;
}

}  // namespace testsupport
