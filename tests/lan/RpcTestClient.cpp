#include "RpcTestClient.h"

#include <stdexcept>

#include "lan/RecordMarking.h"
#include "lan/Vxi11.h"

namespace lantest {

std::string words(std::initializer_list<std::uint32_t> values) {
    std::string bytes;
    lan::XdrWriter writer(bytes);
    for (const auto value : values) {
        writer.u32(value);
    }
    return bytes;
}

std::string callRecord(std::uint32_t xid, std::uint32_t program, std::uint32_t version,
                       std::uint32_t procedure, const std::string& arguments) {
    std::string record = lan::beginRecord();
    lan::XdrWriter writer(record);
    lan::rpc::writeCall(writer, {xid, program, version, procedure});
    record += arguments;
    lan::finishRecord(record);
    return record;
}

std::string RpcTestClient::callRaw(std::uint32_t procedure, const std::string& arguments,
                                   std::chrono::milliseconds timeout) {
    m_socket.send(callRecord(++m_xid, m_program, m_version, procedure, arguments));
    std::string record;
    for (;;) {
        const std::string mark = m_socket.receive(4, timeout);
        const std::uint32_t word = lan::XdrReader(mark).u32("record mark");
        record += m_socket.receive(word & 0x7fffffffu, timeout);
        if (word & 0x80000000u) {
            return record;
        }
    }
}

std::string RpcTestClient::call(std::uint32_t procedure, const std::string& arguments,
                                std::chrono::milliseconds timeout) {
    const std::string record = callRaw(procedure, arguments, timeout);
    lan::XdrReader reader(record);
    lan::rpc::readReply(reader, m_xid);
    return record.substr(record.size() - reader.remaining());
}

Vxi11TestClient::Vxi11TestClient(std::uint16_t corePort)
    : rpc(corePort, lan::vxi11::coreProgram, lan::vxi11::version) {}

std::uint32_t Vxi11TestClient::createLink(bool lock, std::uint32_t lockTimeout,
                                          const std::string& device) {
    std::string arguments = words({7, lock ? 1u : 0u, lockTimeout});
    lan::XdrWriter(arguments).opaque(device);
    const std::string results = rpc.call(lan::vxi11::createLink, arguments);
    lan::XdrReader reader(results);
    const std::uint32_t error = reader.u32("error");
    if (error == 0) {
        link = reader.u32("link");
        abortPort = static_cast<std::uint16_t>(reader.u32("abort port"));
        maxReceiveSize = reader.u32("max receive size");
    }
    return error;
}

std::uint32_t Vxi11TestClient::write(const std::string& data, std::uint32_t flags,
                                     std::uint32_t ioTimeout, std::uint32_t lockTimeout) {
    std::string arguments = words({link, ioTimeout, lockTimeout, flags});
    lan::XdrWriter(arguments).opaque(data);
    const std::string results = rpc.call(lan::vxi11::deviceWrite, arguments, 20s);
    lan::XdrReader reader(results);
    const std::uint32_t error = reader.u32("error");
    const std::uint32_t size = reader.u32("size");
    if (error == 0 && size != data.size()) {
        throw std::runtime_error("device_write took " + std::to_string(size) + " of " +
                                 std::to_string(data.size()) + " bytes");
    }
    return error;
}

Vxi11Read Vxi11TestClient::read(std::uint32_t requestSize, std::uint32_t ioTimeout,
                                std::uint32_t flags, std::uint32_t lockTimeout) {
    const std::string results =
        rpc.call(lan::vxi11::deviceRead,
                 words({link, requestSize, ioTimeout, lockTimeout, flags, '\n'}), 20s);
    lan::XdrReader reader(results);
    Vxi11Read read;
    read.error = reader.u32("error");
    read.reason = reader.u32("reason");
    read.data = std::string(reader.opaque("data"));
    return read;
}

std::string Vxi11TestClient::readAll(std::uint32_t requestSize) {
    std::string data;
    for (;;) {
        const Vxi11Read piece = read(requestSize);
        if (piece.error != 0) {
            throw std::runtime_error("device_read error " + std::to_string(piece.error));
        }
        data += piece.data;
        if (piece.reason & lan::vxi11::reasonEnd) {
            return data;
        }
    }
}

std::pair<std::uint32_t, std::uint32_t> Vxi11TestClient::readStb() {
    const std::string results = rpc.call(lan::vxi11::deviceReadStb, words({link, 0, 0, 1000}));
    lan::XdrReader reader(results);
    const std::uint32_t error = reader.u32("error");
    return {error, reader.u32("status byte")};
}

std::uint32_t Vxi11TestClient::generic(std::uint32_t procedure, std::uint32_t flags,
                                       std::uint32_t lockTimeout) {
    const std::string results = rpc.call(procedure, words({link, flags, lockTimeout, 1000}), 20s);
    lan::XdrReader reader(results);
    return reader.u32("error");
}

std::uint32_t Vxi11TestClient::lock(std::uint32_t flags, std::uint32_t lockTimeout) {
    const std::string results =
        rpc.call(lan::vxi11::deviceLock, words({link, flags, lockTimeout}), 20s);
    lan::XdrReader reader(results);
    return reader.u32("error");
}

std::uint32_t Vxi11TestClient::unlock() {
    return errorOf(lan::vxi11::deviceUnlock, words({link}));
}

std::uint32_t Vxi11TestClient::destroyLink() {
    return errorOf(lan::vxi11::destroyLink, words({link}));
}

std::uint32_t Vxi11TestClient::errorOf(std::uint32_t procedure, const std::string& arguments) {
    const std::string results = rpc.call(procedure, arguments);
    lan::XdrReader reader(results);
    return reader.u32("error");
}

std::uint32_t abortLink(std::uint16_t abortPort, std::uint32_t link) {
    RpcTestClient client(abortPort, lan::vxi11::abortProgram, lan::vxi11::version);
    const std::string results = client.call(lan::vxi11::deviceAbort, words({link}));
    lan::XdrReader reader(results);
    return reader.u32("error");
}

}  // namespace lantest
