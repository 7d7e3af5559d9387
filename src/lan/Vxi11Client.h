#pragma once

// The client end of a VXI-11 link: the core channel's port from the host's portmapper, one
// link to the device, program messages out through device_write and responses in through
// device_read until END. After a timeout the caller clears the device before the next
// message, so that a late response does not answer a later query.

#include <chrono>
#include <cstdint>
#include <string>
#include <string_view>

#include "lan/RecordMarking.h"
#include "lan/TcpStream.h"

namespace lan {

class Vxi11Client {
  public:
    // `portmapperPort` is 111 on every instrument; tests pass their own.
    Vxi11Client(std::string host, std::string device, std::uint16_t portmapperPort = 111);
    ~Vxi11Client();
    Vxi11Client(const Vxi11Client&) = delete;
    Vxi11Client& operator=(const Vxi11Client&) = delete;

    // Asks the portmapper for the core channel, connects and creates the link. Every call
    // throws ClientError naming the host, the port and the step ("asking the portmapper on
    // vna-lab-3:111 for the VXI-11 core channel: connection refused"); the link is then
    // closed.
    void connect(std::chrono::milliseconds timeout);
    bool isOpen() const { return m_stream.isOpen(); }
    // Destroys the link when the channel still works, and closes it.
    void close();
    // Sends one program message ended by NL, in pieces of the device's receive size, END on
    // the last.
    void send(std::string_view message, std::chrono::milliseconds timeout);
    // One response without its terminator; the device may take `timeout` to start it.
    std::string readResponse(std::chrono::milliseconds timeout);
    // device_clear: the device drops its pending input and output.
    void clear(std::chrono::milliseconds timeout);

  private:
    // The results of one call on the open stream, or ClientError. A call that lets the
    // device wait `timeout` is given `deviceWait` more to answer.
    std::string_view call(std::uint32_t program, std::uint32_t procedure,
                          std::string_view arguments, std::chrono::milliseconds timeout,
                          const std::string& doing,
                          std::chrono::milliseconds deviceWait = std::chrono::milliseconds(0));
    // Closes the channel and throws "<why> (<doing>)".
    [[noreturn]] void fail(const std::string& doing, const std::string& why);
    // "host:port", an IPv6 host in brackets.
    std::string where(std::uint16_t port) const;

    std::string m_host;
    std::string m_device;
    std::uint16_t m_portmapperPort;
    std::uint16_t m_corePort = 0;
    std::uint32_t m_link = 0;
    bool m_linked = false;
    std::uint32_t m_maxReceiveSize = 0;
    std::uint32_t m_xid = 0;
    TcpStream m_stream;
    RecordReader m_records;
    std::string m_call;
    std::string m_bytes;
    std::string m_message;
    std::string m_arguments;
};

}  // namespace lan
