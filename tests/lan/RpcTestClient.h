#pragma once

// A VXI-11 and portmapper client for the tests, built on the server's own XDR and RPC
// helpers over a plain loopback socket.

#include <cstdint>
#include <string>

#include "TestSocket.h"
#include "lan/OncRpc.h"

namespace lantest {

class RpcTestClient {
  public:
    RpcTestClient(std::uint16_t port, std::uint32_t program, std::uint32_t version)
        : m_socket(port), m_program(program), m_version(version) {}

    // The results of an accepted, successful call; throws otherwise.
    std::string call(std::uint32_t procedure, const std::string& arguments,
                     std::chrono::milliseconds timeout = 5s);
    // The raw reply record, for calls the server should refuse.
    std::string callRaw(std::uint32_t procedure, const std::string& arguments,
                        std::chrono::milliseconds timeout = 5s);
    TestSocket& socket() { return m_socket; }

  private:
    TestSocket m_socket;
    std::uint32_t m_program;
    std::uint32_t m_version;
    std::uint32_t m_xid = 100;
};

// XDR words for call arguments.
std::string words(std::initializer_list<std::uint32_t> values);
// A call record as sent on TCP, including its mark.
std::string callRecord(std::uint32_t xid, std::uint32_t program, std::uint32_t version,
                       std::uint32_t procedure, const std::string& arguments);

struct Vxi11Read {
    std::uint32_t error;
    std::uint32_t reason;
    std::string data;
};

class Vxi11TestClient {
  public:
    explicit Vxi11TestClient(std::uint16_t corePort);

    // Returns the error; on success `link` and `abortPort` are set.
    std::uint32_t createLink(bool lock = false, std::uint32_t lockTimeout = 0,
                             const std::string& device = "inst0");
    std::uint32_t write(const std::string& data, std::uint32_t flags = 8,
                        std::uint32_t ioTimeout = 2000, std::uint32_t lockTimeout = 0);
    Vxi11Read read(std::uint32_t requestSize = 1u << 20, std::uint32_t ioTimeout = 2000,
                   std::uint32_t flags = 0, std::uint32_t lockTimeout = 0);
    // Reads pieces until END; throws on an error.
    std::string readAll(std::uint32_t requestSize = 1u << 20);
    std::pair<std::uint32_t, std::uint32_t> readStb();
    // trigger, clear, remote, local: the error.
    std::uint32_t generic(std::uint32_t procedure, std::uint32_t flags = 0,
                          std::uint32_t lockTimeout = 0);
    std::uint32_t lock(std::uint32_t flags = 0, std::uint32_t lockTimeout = 0);
    std::uint32_t unlock();
    std::uint32_t destroyLink();
    // The first word of a procedure's result, for the procedures answered "not supported".
    std::uint32_t errorOf(std::uint32_t procedure, const std::string& arguments);

    std::uint32_t link = 0;
    std::uint16_t abortPort = 0;
    std::uint32_t maxReceiveSize = 0;
    RpcTestClient rpc;
};

// device_abort on the abort channel; the error.
std::uint32_t abortLink(std::uint16_t abortPort, std::uint32_t link);

}  // namespace lantest
