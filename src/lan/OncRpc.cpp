#include "lan/OncRpc.h"

#include "lan/RecordMarking.h"

namespace lan::rpc {

namespace {

constexpr std::uint32_t messageCall = 0;
constexpr std::uint32_t messageReply = 1;
constexpr std::uint32_t rpcVersion = 2;
constexpr std::uint32_t replyAccepted = 0;
constexpr std::uint32_t authNone = 0;
constexpr std::size_t maxAuthBytes = 400;

void skipAuth(XdrReader& reader, const char* what) {
    reader.u32(what);
    reader.opaque(what, maxAuthBytes);
}

}  // namespace

Call readCall(XdrReader& reader) {
    Call call;
    call.xid = reader.u32("RPC transaction id");
    if (const auto type = reader.u32("RPC message type"); type != messageCall) {
        throw ProtocolError("RPC message type " + std::to_string(type) + " is not a call");
    }
    if (const auto version = reader.u32("RPC version"); version != rpcVersion) {
        throw ProtocolError("RPC version " + std::to_string(version) + " is not 2");
    }
    call.program = reader.u32("RPC program");
    call.version = reader.u32("RPC program version");
    call.procedure = reader.u32("RPC procedure");
    skipAuth(reader, "RPC credentials");
    skipAuth(reader, "RPC verifier");
    return call;
}

void writeCall(XdrWriter& writer, const Call& call) {
    for (const std::uint32_t word : {call.xid, messageCall, rpcVersion, call.program, call.version,
                                     call.procedure, authNone, 0u, authNone, 0u}) {
        writer.u32(word);
    }
}

std::string beginReply(std::uint32_t xid, AcceptStat stat, std::uint32_t servedVersion) {
    std::string record = beginRecord();
    XdrWriter writer(record);
    for (const std::uint32_t word :
         {xid, messageReply, replyAccepted, authNone, 0u, static_cast<std::uint32_t>(stat)}) {
        writer.u32(word);
    }
    if (stat == AcceptStat::ProgramMismatch) {
        writer.u32(servedVersion);
        writer.u32(servedVersion);
    }
    return record;
}

void readReply(XdrReader& reader, std::uint32_t xid) {
    if (const auto got = reader.u32("RPC transaction id"); got != xid) {
        throw ProtocolError("RPC reply for transaction " + std::to_string(got) + ", expected " +
                            std::to_string(xid));
    }
    if (reader.u32("RPC message type") != messageReply) {
        throw ProtocolError("RPC message is not a reply");
    }
    if (const auto status = reader.u32("RPC reply status"); status != replyAccepted) {
        throw ProtocolError("RPC call denied (reply status " + std::to_string(status) + ")");
    }
    skipAuth(reader, "RPC verifier");
    if (const auto stat = reader.u32("RPC accept status"); stat != 0) {
        throw ProtocolError("RPC call not accepted (accept status " + std::to_string(stat) + ")");
    }
}

}  // namespace lan::rpc
