#pragma once

// A link straight onto a served instrument's scpi::Device, in memory: each message runs at
// once on the session and its reply waits for the next read. Tests make it fail on demand.

#include <deque>
#include <functional>
#include <memory>
#include <string>

#include "analyzer/remote/Transport.h"
#include "scpi/Device.h"

namespace testsupport {

class DeviceTransport final : public remote::Transport {
  public:
    explicit DeviceTransport(scpi::Device& device, std::string resource = "TCPIP::sim::SOCKET");

    std::string resource() const override { return m_resource; }
    void open() override;
    void send(std::string_view message) override;
    std::string read(std::chrono::milliseconds timeout) override;
    void abandonReply() override;
    unsigned connections() const override { return m_connections; }

    // Called with each message before it runs; a LinkFailure it throws fails the send, and
    // the message never reaches the instrument.
    std::function<void(std::string_view)> beforeSend;
    // Called with each reply before it is delivered; a LinkFailure it throws fails the read.
    std::function<void(const std::string&)> beforeReply;

  private:
    scpi::Device& m_device;
    std::string m_resource;
    std::unique_ptr<scpi::Session> m_session;
    std::deque<std::string> m_replies;
    unsigned m_connections = 0;
    bool m_stale = false;
};

}  // namespace testsupport
