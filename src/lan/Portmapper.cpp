#include "lan/Portmapper.h"

#include <stdexcept>

namespace lan {

namespace {

constexpr std::uint32_t procedureNull = 0;
constexpr std::uint32_t procedureGetPort = 3;
constexpr std::size_t maxCallBytes = 8192;

}  // namespace

Portmapper::Portmapper(ServerContext& context, const asio::ip::address& address, std::uint16_t port,
                       std::vector<Mapping> mappings)
    : m_context(context),
      m_mappings(std::move(mappings)),
      m_tcp(context, {address, port}, {rpc::portmapProgram, rpc::portmapVersion, maxCallBytes},
            [this](RpcTcpServer::ConnectionId, const rpc::Call& call, XdrReader& arguments,
                   RpcTcpServer::Reply reply) { answer(call, arguments, reply); }),
      m_udp(asio::make_strand(context.io())) {
    const asio::ip::udp::endpoint endpoint(address, m_tcp.port());
    try {
        m_udp.open(endpoint.protocol());
        m_udp.bind(endpoint);
    } catch (const std::system_error& e) {
        throw std::runtime_error("cannot listen on UDP " + address.to_string() + ":" +
                                 std::to_string(endpoint.port()) + ": " + e.code().message());
    }
    m_closer = m_context.addCloser([this] {
        std::error_code ignored;
        m_udp.close(ignored);
    });
    asio::dispatch(m_udp.get_executor(), [this] { receive(); });
}

Portmapper::~Portmapper() {
    m_context.stop();
    m_context.removeCloser(m_closer);
}

void Portmapper::answer(const rpc::Call& call, XdrReader& arguments,
                        const RpcTcpServer::Reply& reply) {
    if (call.procedure == procedureNull) {
        reply(rpc::beginReply(call.xid, rpc::AcceptStat::Success));
        return;
    }
    if (call.procedure != procedureGetPort) {
        reply(rpc::beginReply(call.xid, rpc::AcceptStat::ProcedureUnavailable));
        return;
    }
    const std::uint32_t program = arguments.u32("GETPORT program");
    const std::uint32_t version = arguments.u32("GETPORT version");
    const std::uint32_t protocol = arguments.u32("GETPORT protocol");
    arguments.u32("GETPORT port");
    std::uint32_t port = 0;
    for (const auto& mapping : m_mappings) {
        if (mapping.program == program && mapping.version == version &&
            mapping.protocol == protocol) {
            port = mapping.port;
        }
    }
    std::string record = rpc::beginReply(call.xid, rpc::AcceptStat::Success);
    XdrWriter(record).u32(port);
    reply(std::move(record));
}

void Portmapper::receive() {
    m_udp.async_receive_from(
        asio::buffer(m_datagram), m_sender, [this](std::error_code error, std::size_t size) {
            if (error == asio::error::operation_aborted) {
                return;
            }
            if (!error) {
                XdrReader reader(std::string_view(m_datagram.data(), size));
                std::string record;
                try {
                    const rpc::Call call = rpc::readCall(reader);
                    if (call.program != rpc::portmapProgram) {
                        record = rpc::beginReply(call.xid, rpc::AcceptStat::ProgramUnavailable);
                    } else if (call.version != rpc::portmapVersion) {
                        record = rpc::beginReply(call.xid, rpc::AcceptStat::ProgramMismatch,
                                                 rpc::portmapVersion);
                    } else {
                        try {
                            answer(call, reader,
                                   [&record](std::string r) { record = std::move(r); });
                        } catch (const ProtocolError&) {
                            record = rpc::beginReply(call.xid, rpc::AcceptStat::GarbageArguments);
                        }
                    }
                } catch (const ProtocolError&) {
                    // Not an RPC call: a datagram gets no answer.
                }
                if (!record.empty()) {
                    std::error_code ignored;
                    // Datagrams carry no record mark.
                    m_udp.send_to(asio::buffer(record.data() + 4, record.size() - 4), m_sender, 0,
                                  ignored);
                }
            }
            receive();
        });
}

}  // namespace lan
