#include <gtest/gtest.h>

#include "RpcTestClient.h"
#include "lan/Portmapper.h"
#include "lan/Vxi11.h"

using namespace lantest;

namespace {

constexpr std::uint32_t getPort = 3;

class ThreadedPortmapper : public ::testing::Test {
  protected:
    lan::ServerContext context{2};
    lan::Portmapper portmapper{
        context,
        asio::ip::make_address("127.0.0.1"),
        0,
        {{lan::vxi11::coreProgram, lan::vxi11::version, lan::rpc::protocolTcp, 4321}}};
};

std::uint32_t udpGetPort(std::uint16_t port, std::uint32_t xid, std::uint32_t program,
                         std::uint32_t protocol) {
    const std::string record = callRecord(xid, lan::rpc::portmapProgram, lan::rpc::portmapVersion,
                                          getPort, words({program, 1, protocol, 0}));
    const std::string answer = udpExchange(port, std::string_view(record).substr(4));
    lan::XdrReader reader(answer);
    lan::rpc::readReply(reader, xid);
    return reader.u32("port");
}

}  // namespace

TEST_F(ThreadedPortmapper, AnswersGetPortOverTcpAndUdp) {
    RpcTestClient tcp(portmapper.port(), lan::rpc::portmapProgram, lan::rpc::portmapVersion);
    auto tcpGetPort = [&](std::uint32_t program, std::uint32_t protocol) {
        const std::string results = tcp.call(getPort, words({program, 1, protocol, 0}));
        lan::XdrReader reader(results);
        return reader.u32("port");
    };
    EXPECT_EQ(tcpGetPort(lan::vxi11::coreProgram, lan::rpc::protocolTcp), 4321u);
    EXPECT_EQ(tcpGetPort(lan::vxi11::coreProgram, lan::rpc::protocolUdp), 0u);
    EXPECT_EQ(tcpGetPort(lan::vxi11::abortProgram, lan::rpc::protocolTcp), 0u);
    EXPECT_EQ(tcp.call(0, ""), "");  // NULL, on the same connection

    EXPECT_EQ(udpGetPort(portmapper.port(), 77, lan::vxi11::coreProgram, lan::rpc::protocolTcp),
              4321u);
    EXPECT_EQ(udpGetPort(portmapper.port(), 78, 123456, lan::rpc::protocolTcp), 0u);
}

TEST_F(ThreadedPortmapper, RefusesOtherProgramsAndBadCalls) {
    RpcTestClient wrongVersion(portmapper.port(), lan::rpc::portmapProgram, 3);
    const std::string results = wrongVersion.callRaw(getPort, words({1, 1, 6, 0}));
    lan::XdrReader mismatch(results);
    mismatch.u32("xid");
    mismatch.u32("type");
    mismatch.u32("status");
    mismatch.u32("verifier");
    mismatch.opaque("verifier body");
    EXPECT_EQ(mismatch.u32("accept status"), 2u);  // program mismatch
    EXPECT_EQ(mismatch.u32("low"), 2u);

    // Arguments cut short are garbage; the connection goes on.
    RpcTestClient tcp(portmapper.port(), lan::rpc::portmapProgram, lan::rpc::portmapVersion);
    const std::string garbage = tcp.callRaw(getPort, words({1, 1}));
    EXPECT_EQ(lan::XdrReader(std::string_view(garbage).substr(20)).u32("accept status"), 4u);
    EXPECT_EQ(tcp.call(0, ""), "");

    // A datagram that is no call gets no answer, and the portmapper keeps answering.
    EXPECT_THROW(udpExchange(portmapper.port(), "noise", 200ms), std::runtime_error);
    EXPECT_EQ(udpGetPort(portmapper.port(), 79, lan::vxi11::coreProgram, lan::rpc::protocolTcp),
              4321u);

    // A record longer than a portmapper call closes that connection only.
    TestSocket flood(portmapper.port());
    flood.send(words({0x80000000u | 100000}) + std::string(9000, 'x'));
    EXPECT_TRUE(flood.closedWithin(2s));
    EXPECT_EQ(tcp.call(0, ""), "");
}
