#pragma once

// The LAN back end's link over a raw SCPI socket. After a failure or an abandoned reply the
// connection is reopened before the next message: a raw socket has no device clear.

#include "analyzer/remote/ResourceString.h"
#include "analyzer/remote/Transport.h"
#include "lan/RawSocketClient.h"

namespace remote {

class RawSocketTransport final : public Transport {
  public:
    RawSocketTransport(const ResourceString& resource, std::chrono::milliseconds timeout);

    std::string resource() const override { return m_resource; }
    void open() override;
    void send(std::string_view message) override;
    std::string read(std::chrono::milliseconds timeout) override;
    void abandonReply() override { m_stale = true; }
    unsigned connections() const override { return m_connections; }

  private:
    std::string m_resource;
    std::chrono::milliseconds m_timeout;
    lan::RawSocketClient m_client;
    unsigned m_connections = 0;
    bool m_stale = false;
};

}  // namespace remote
