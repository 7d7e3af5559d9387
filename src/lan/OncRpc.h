#pragma once

// ONC RPC version 2 message headers, as far as the portmapper and VXI-11 need them: calls
// with any credentials (skipped), replies accepted with AUTH_NONE.

#include <cstdint>
#include <string>

#include "lan/Xdr.h"

namespace lan::rpc {

constexpr std::uint32_t portmapProgram = 100000;
constexpr std::uint32_t portmapVersion = 2;
constexpr std::uint32_t protocolTcp = 6;
constexpr std::uint32_t protocolUdp = 17;

struct Call {
    std::uint32_t xid = 0;
    std::uint32_t program = 0;
    std::uint32_t version = 0;
    std::uint32_t procedure = 0;
};

enum class AcceptStat : std::uint32_t {
    Success = 0,
    ProgramUnavailable = 1,
    ProgramMismatch = 2,
    ProcedureUnavailable = 3,
    GarbageArguments = 4,
};

// Reads a call header and its credentials, leaving the reader at the arguments. Throws
// ProtocolError for anything that is not an RPC version 2 call.
Call readCall(XdrReader& reader);
// Appends a call header with AUTH_NONE credentials.
void writeCall(XdrWriter& writer, const Call& call);

// A reply record (see beginRecord) up to its results, which the caller appends. A program
// mismatch carries the one version served.
std::string beginReply(std::uint32_t xid, AcceptStat stat, std::uint32_t servedVersion = 0);
// Reads a reply header for `xid` up to the results; throws ProtocolError unless the call was
// accepted and succeeded.
void readReply(XdrReader& reader, std::uint32_t xid);

}  // namespace lan::rpc
