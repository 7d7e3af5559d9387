#include "lan/Vxi11Client.h"

#include <algorithm>

#include "lan/ClientError.h"
#include "lan/OncRpc.h"
#include "lan/Vxi11.h"
#include "scpi/Block.h"
#include "scpi/ProgramMessage.h"

namespace lan {
namespace {

// Pieces asked of device_read; the device sends less when it has less.
constexpr std::uint32_t requestSize = 4u << 20;
// The longest response taken: a block at the codec's limit and its header.
constexpr std::size_t maxResponseBytes = scpi::maxBlockBytes + 64;
constexpr std::size_t maxRecordBytes = requestSize + 1024;
// A device answers a call that waited its whole I/O timeout a little after it.
constexpr std::chrono::milliseconds replyMargin{2000};
constexpr std::chrono::milliseconds destroyTimeout{1000};
constexpr std::uint32_t getPort = 3;
// Any number: the device keeps it only to tell links apart.
constexpr std::uint32_t clientId = 0x72637663;

std::string errorText(std::uint32_t error) {
    switch (error) {
        case vxi11::deviceNotAccessible:
            return "the device is not accessible";
        case vxi11::invalidLink:
            return "the device does not know the link";
        case vxi11::operationNotSupported:
            return "the device does not support the operation";
        case vxi11::outOfResources:
            return "the device is out of resources";
        case vxi11::deviceLocked:
            return "the device is locked by another client";
        case vxi11::ioError:
            return "the device reports an I/O error";
        case vxi11::invalidAddress:
            return "there is no such device";
        case vxi11::aborted:
            return "the operation was aborted";
        default:
            return "VXI-11 error " + std::to_string(error);
    }
}

std::uint32_t milliseconds(std::chrono::milliseconds duration) {
    return static_cast<std::uint32_t>(std::clamp<std::int64_t>(duration.count(), 0, 0x7fffffff));
}

// The response without the NL that ends it; a block keeps every byte it announces.
std::string withoutTerminator(std::string response) {
    std::size_t end = response.size();
    std::optional<scpi::BlockHeader> header;
    if (!response.empty() && response.front() == '#') {
        try {
            header = scpi::readBlockHeader(response);
        } catch (const scpi::Error&) {
        }
    }
    if (header && header->headerBytes + header->dataBytes <= end) {
        end = header->headerBytes + header->dataBytes;
    } else {
        if (end > 0 && response[end - 1] == '\n') {
            --end;
        }
        if (end > 0 && response[end - 1] == '\r') {
            --end;
        }
    }
    response.resize(end);
    return response;
}

}  // namespace

Vxi11Client::Vxi11Client(std::string host, std::string device, std::uint16_t portmapperPort)
    : m_host(std::move(host)),
      m_device(std::move(device)),
      m_portmapperPort(portmapperPort),
      m_records(maxRecordBytes) {}

Vxi11Client::~Vxi11Client() {
    close();
}

std::string Vxi11Client::where(std::uint16_t port) const {
    const bool v6 = m_host.find(':') != std::string::npos;
    return (v6 ? "[" + m_host + "]" : m_host) + ":" + std::to_string(port);
}

void Vxi11Client::fail(const std::string& doing, const std::string& why) {
    m_stream.close();
    m_linked = false;
    throw ClientError(why + " (" + doing + ")");
}

std::string_view Vxi11Client::call(std::uint32_t program, std::uint32_t procedure,
                                   std::string_view arguments, std::chrono::milliseconds timeout,
                                   const std::string& doing, std::chrono::milliseconds deviceWait) {
    const std::uint32_t version =
        program == rpc::portmapProgram ? rpc::portmapVersion : vxi11::version;
    m_call = beginRecord();
    XdrWriter writer(m_call);
    rpc::writeCall(writer, {++m_xid, program, version, procedure});
    m_call += arguments;
    finishRecord(m_call);
    try {
        m_stream.writeAll(m_call, timeout);
        m_records.next();
        const auto deadline = std::chrono::steady_clock::now() + timeout + deviceWait;
        for (;;) {
            const std::size_t used = m_records.feed(m_bytes);
            m_bytes.erase(0, used);
            if (m_records.complete()) {
                break;
            }
            m_stream.readSome(m_bytes, deadline, timeout);
        }
        XdrReader reader(m_records.record());
        rpc::readReply(reader, m_xid);
        return m_records.record().substr(m_records.record().size() - reader.remaining());
    } catch (const ClientError& error) {
        fail(doing, error.what());
    } catch (const ProtocolError& error) {
        fail(doing, std::string("the reply is not valid RPC (") + error.what() + ")");
    }
}

void Vxi11Client::connect(std::chrono::milliseconds timeout) {
    close();
    m_bytes.clear();
    m_records = RecordReader(maxRecordBytes);

    const std::string asking =
        "asking the portmapper on " + where(m_portmapperPort) + " for the VXI-11 core channel";
    try {
        m_stream.connect(m_host, m_portmapperPort, timeout);
    } catch (const ClientError& error) {
        fail(asking, error.what());
    }
    std::string arguments;
    XdrWriter writer(arguments);
    for (const std::uint32_t word : {vxi11::coreProgram, vxi11::version, rpc::protocolTcp, 0u}) {
        writer.u32(word);
    }
    std::uint32_t port = 0;
    try {
        XdrReader reader(call(rpc::portmapProgram, getPort, arguments, timeout, asking));
        port = reader.u32("port");
    } catch (const ProtocolError& error) {
        fail(asking, std::string("the reply is not valid RPC (") + error.what() + ")");
    }
    m_stream.close();
    m_bytes.clear();
    if (port == 0 || port > 65535) {
        fail(asking, "the host serves no VXI-11 core channel");
    }
    m_corePort = static_cast<std::uint16_t>(port);

    const std::string linking = "creating a link to " + m_device + " on " + where(m_corePort);
    try {
        m_stream.connect(m_host, m_corePort, timeout);
    } catch (const ClientError& error) {
        fail(linking, error.what());
    }
    arguments.clear();
    for (const std::uint32_t word : {clientId, 0u, 0u}) {
        writer.u32(word);
    }
    writer.opaque(m_device);
    try {
        XdrReader reader(call(vxi11::coreProgram, vxi11::createLink, arguments, timeout, linking));
        if (const auto error = reader.u32("error"); error != vxi11::noError) {
            fail(linking, errorText(error));
        }
        m_link = reader.u32("link");
        reader.u32("abort port");
        m_maxReceiveSize = std::max<std::uint32_t>(reader.u32("max receive size"), 1);
    } catch (const ProtocolError& error) {
        fail(linking, std::string("the reply is not valid RPC (") + error.what() + ")");
    }
    m_linked = true;
}

void Vxi11Client::close() {
    if (m_stream.isOpen() && m_linked) {
        std::string arguments;
        XdrWriter(arguments).u32(m_link);
        try {
            call(vxi11::coreProgram, vxi11::destroyLink, arguments, destroyTimeout,
                 "destroying the link");
        } catch (const ClientError&) {
            // The link dies with the connection anyway.
        }
    }
    m_linked = false;
    m_stream.close();
}

void Vxi11Client::send(std::string_view message, std::chrono::milliseconds timeout) {
    if (!m_linked) {
        throw ClientError("not connected");
    }
    const std::string doing = "device_write on " + where(m_corePort);
    m_message.assign(message);
    m_message += '\n';
    std::string_view left = m_message;
    while (!left.empty()) {
        const std::string_view piece = left.substr(0, m_maxReceiveSize);
        const bool last = piece.size() == left.size();
        m_arguments.clear();
        XdrWriter writer(m_arguments);
        for (const std::uint32_t word :
             {m_link, milliseconds(timeout), 0u, last ? vxi11::flagEnd : 0u}) {
            writer.u32(word);
        }
        writer.opaque(piece);
        std::uint32_t taken = 0;
        try {
            XdrReader reader(call(vxi11::coreProgram, vxi11::deviceWrite, m_arguments, timeout,
                                  doing, replyMargin));
            const auto error = reader.u32("error");
            taken = reader.u32("size");
            if (error == vxi11::ioTimeout) {
                throw ClientError("the instrument took no data for " + secondsText(timeout) + " (" +
                                  doing + ")");
            }
            if (error != vxi11::noError) {
                fail(doing, errorText(error));
            }
        } catch (const ProtocolError& error) {
            fail(doing, std::string("the reply is not valid RPC (") + error.what() + ")");
        }
        if (taken == 0 || taken > piece.size()) {
            fail(doing, "the instrument took " + std::to_string(taken) + " of " +
                            std::to_string(piece.size()) + " bytes");
        }
        left.remove_prefix(taken);
    }
}

std::string Vxi11Client::readResponse(std::chrono::milliseconds timeout) {
    if (!m_linked) {
        throw ClientError("not connected");
    }
    const std::string doing = "device_read on " + where(m_corePort);
    std::string response;
    for (;;) {
        m_arguments.clear();
        XdrWriter writer(m_arguments);
        for (const std::uint32_t word : {m_link, requestSize, milliseconds(timeout), 0u, 0u, 0u}) {
            writer.u32(word);
        }
        std::uint32_t reason = 0;
        std::size_t pieceBytes = 0;
        try {
            XdrReader reader(call(vxi11::coreProgram, vxi11::deviceRead, m_arguments, timeout,
                                  doing, replyMargin));
            const auto error = reader.u32("error");
            reason = reader.u32("reason");
            const std::string_view data = reader.opaque("data", requestSize);
            if (error == vxi11::ioTimeout) {
                // The link stays: the caller clears the device before its next message.
                throw ClientError("no reply in " + secondsText(timeout) + " (" + doing + ")");
            }
            if (error != vxi11::noError) {
                fail(doing, errorText(error));
            }
            pieceBytes = data.size();
            response += data;
        } catch (const ProtocolError& error) {
            fail(doing, std::string("the reply is not valid RPC (") + error.what() + ")");
        }
        if (response.size() > maxResponseBytes) {
            fail(doing, "the reply exceeds " + std::to_string(maxResponseBytes >> 20) +
                            " MiB without its end");
        }
        if (reason & vxi11::reasonEnd) {
            return withoutTerminator(std::move(response));
        }
        if (pieceBytes == 0) {
            fail(doing, "the instrument sent an empty piece without END");
        }
    }
}

void Vxi11Client::clear(std::chrono::milliseconds timeout) {
    if (!m_linked) {
        throw ClientError("not connected");
    }
    const std::string doing = "device_clear on " + where(m_corePort);
    m_arguments.clear();
    XdrWriter writer(m_arguments);
    for (const std::uint32_t word : {m_link, 0u, 0u, milliseconds(timeout)}) {
        writer.u32(word);
    }
    try {
        XdrReader reader(
            call(vxi11::coreProgram, vxi11::deviceClear, m_arguments, timeout, doing, replyMargin));
        if (const auto error = reader.u32("error"); error != vxi11::noError) {
            fail(doing, errorText(error));
        }
    } catch (const ProtocolError& error) {
        fail(doing, std::string("the reply is not valid RPC (") + error.what() + ")");
    }
}

}  // namespace lan
