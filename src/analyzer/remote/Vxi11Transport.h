#pragma once

// The LAN back end's link over VXI-11. After a timeout or an abandoned reply the device is
// cleared before the next message; a link whose channel failed is made anew.

#include "analyzer/remote/ResourceString.h"
#include "analyzer/remote/Transport.h"
#include "lan/Vxi11Client.h"

namespace remote {

class Vxi11Transport final : public Transport {
  public:
    // `portmapperPort` is 111 on every instrument; tests pass their own.
    Vxi11Transport(const ResourceString& resource, std::chrono::milliseconds timeout,
                   std::uint16_t portmapperPort = 111);

    std::string resource() const override { return m_resource; }
    void open() override;
    void send(std::string_view message) override;
    std::string read(std::chrono::milliseconds timeout) override;
    void abandonReply() override { m_stale = true; }
    unsigned connections() const override { return m_connections; }

  private:
    std::string m_resource;
    std::chrono::milliseconds m_timeout;
    lan::Vxi11Client m_client;
    unsigned m_connections = 0;
    bool m_stale = false;
};

}  // namespace remote
