#include "analyzer/remote/LanTransport.h"

#include <utility>

#include "lan/ClientError.h"
#include "lan/RawSocketClient.h"
#include "lan/Vxi11Client.h"

namespace remote {
namespace {

// Recovers an open link whose last reply is not wanted; false when it must be made anew.
bool recoverInPlace(lan::RawSocketClient& client, std::chrono::milliseconds) {
    client.close();
    return false;
}

bool recoverInPlace(lan::Vxi11Client& client, std::chrono::milliseconds timeout) {
    try {
        client.clear(timeout);
        return true;
    } catch (const lan::ClientError&) {
        return false;
    }
}

// A client's errors become LinkFailure and leave the link to recover before its next use.
template <class Client>
class ClientTransport final : public Transport {
  public:
    template <class... ClientArguments>
    ClientTransport(std::string resource, std::chrono::milliseconds timeout,
                    ClientArguments&&... arguments)
        : m_resource(std::move(resource)),
          m_timeout(timeout),
          m_client(std::forward<ClientArguments>(arguments)...) {}

    std::string resource() const override { return m_resource; }
    void open() override {
        if (m_client.isOpen()) {
            if (!m_stale) {
                return;
            }
            if (recoverInPlace(m_client, m_timeout)) {
                m_stale = false;
                return;
            }
        }
        guarded([&] { m_client.connect(m_timeout); });
        m_stale = false;
        ++m_connections;
    }
    void send(std::string_view message) override {
        guarded([&] { m_client.send(message, m_timeout); });
    }
    std::string read(std::chrono::milliseconds timeout) override {
        std::string response;
        guarded([&] { response = m_client.readResponse(timeout); });
        return response;
    }
    void abandonReply() override { m_stale = true; }
    unsigned connections() const override { return m_connections; }

  private:
    template <class F>
    void guarded(F&& f) {
        try {
            f();
        } catch (const lan::ClientError& error) {
            m_stale = true;
            throw LinkFailure(error.what());
        }
    }

    std::string m_resource;
    std::chrono::milliseconds m_timeout;
    Client m_client;
    unsigned m_connections = 0;
    bool m_stale = false;
};

}  // namespace

std::unique_ptr<Transport> makeLanTransport(const ResourceString& resource,
                                            std::chrono::milliseconds timeout) {
    if (resource.kind == ResourceString::Kind::Socket) {
        return std::make_unique<ClientTransport<lan::RawSocketClient>>(
            resource.text, timeout, resource.host, resource.port);
    }
    return std::make_unique<ClientTransport<lan::Vxi11Client>>(resource.text, timeout,
                                                               resource.host, resource.device);
}

}  // namespace remote
