// The VXI-11 client against the served side's portmapper and core channel on loopback, on a
// portmapper port of the test's own (clients use 111, which needs privileges).

#include <gtest/gtest.h>

#include <thread>

#include "FakeDevice.h"
#include "lan/ClientError.h"
#include "lan/Portmapper.h"
#include "lan/Vxi11.h"
#include "lan/Vxi11Client.h"
#include "lan/Vxi11Server.h"

using namespace std::chrono_literals;
using lantest::FakeDevice;

namespace {

std::string errorOf(const std::function<void()>& action) {
    try {
        action();
    } catch (const lan::ClientError& error) {
        return error.what();
    }
    return "no error";
}

class ThreadedVxi11Client : public ::testing::Test {
  protected:
    ThreadedVxi11Client()
        : server(context, device, loopback, options()),
          portmapper(context, loopback, 0,
                     {{lan::vxi11::coreProgram, lan::vxi11::version, lan::rpc::protocolTcp,
                       server.corePort()}}) {}

    static lan::Vxi11Server::Options options() {
        lan::Vxi11Server::Options options;
        options.maxReceiveSize = 4096;
        return options;
    }

    std::string query(lan::Vxi11Client& client, const std::string& message) {
        client.send(message, 2s);
        return client.readResponse(2s);
    }

    const asio::ip::address loopback = asio::ip::make_address("127.0.0.1");
    FakeDevice device;
    lan::ServerContext context{2};
    lan::Vxi11Server server;
    lan::Portmapper portmapper;
};

}  // namespace

TEST_F(ThreadedVxi11Client, MessagesAndBlocksCrossWholeInPieces) {
    lan::Vxi11Client client("127.0.0.1", "inst0", portmapper.port());
    client.connect(2s);
    EXPECT_EQ(query(client, "*IDN?"), "FAKE,LAN-TEST,0,1.0");
    // A block holding NL and NUL, longer than a read piece of the server's, keeps every byte.
    EXPECT_TRUE(query(client, "BLOCK? 100000") == FakeDevice::blockReply(100000));
    // A message longer than the device takes at once arrives as one message.
    const std::string data = "DATA " + std::string(10000, 'x');
    client.send(data, 2s);
    EXPECT_EQ(query(client, "ECHO? after"), "after");
    const auto executed = device.executed();
    ASSERT_GE(executed.size(), 2u);
    EXPECT_EQ(executed[executed.size() - 2], data);

    // A reconnection makes a new link that works as the first.
    client.close();
    EXPECT_FALSE(client.isOpen());
    client.connect(2s);
    EXPECT_EQ(query(client, "ECHO? again"), "again");
}

TEST_F(ThreadedVxi11Client, ATimeoutKeepsTheLinkAndAClearDropsTheLateReply) {
    lan::Vxi11Client client("127.0.0.1", "inst0", portmapper.port());
    client.connect(2s);
    client.send("WAIT?", 2s);
    const std::string port = std::to_string(server.corePort());
    EXPECT_EQ(errorOf([&] { client.readResponse(300ms); }),
              "no reply in 0.3 s (device_read on 127.0.0.1:" + port + ")");
    EXPECT_TRUE(client.isOpen());
    // The reply comes after all, and waits on the link until the clear drops it.
    device.release();
    std::this_thread::sleep_for(100ms);
    client.clear(2s);
    EXPECT_EQ(device.clears(), 1);
    EXPECT_EQ(query(client, "ECHO? fresh"), "fresh");
}

TEST_F(ThreadedVxi11Client, FailuresNameTheHostThePortAndTheStep) {
    // Nothing listens on a port taken and given back.
    std::uint16_t unused = 0;
    {
        asio::io_context io;
        asio::ip::tcp::acceptor acceptor(io, {loopback, 0});
        unused = acceptor.local_endpoint().port();
    }
    lan::Vxi11Client refused("127.0.0.1", "inst0", unused);
    EXPECT_EQ(errorOf([&] { refused.connect(2s); }),
              "connection refused (asking the portmapper on 127.0.0.1:" + std::to_string(unused) +
                  " for the VXI-11 core channel)");
    EXPECT_FALSE(refused.isOpen());

    lan::Portmapper empty(context, loopback, 0, {});
    lan::Vxi11Client unmapped("127.0.0.1", "inst0", empty.port());
    EXPECT_EQ(errorOf([&] { unmapped.connect(2s); }),
              "the host serves no VXI-11 core channel (asking the portmapper on 127.0.0.1:" +
                  std::to_string(empty.port()) + " for the VXI-11 core channel)");

    lan::Vxi11Client wrongDevice("127.0.0.1", "gpib0,7", portmapper.port());
    EXPECT_EQ(errorOf([&] { wrongDevice.connect(2s); }),
              "there is no such device (creating a link to gpib0,7 on 127.0.0.1:" +
                  std::to_string(server.corePort()) + ")");

    lan::Vxi11Client never("127.0.0.1", "inst0", portmapper.port());
    EXPECT_EQ(errorOf([&] { never.send("*IDN?", 1s); }), "not connected");
}

// A portmapper that answers with bytes that are not RPC, or not at all.
TEST(ThreadedVxi11ClientGarbage, AGarbledOrSilentPortmapperIsAClearError) {
    for (const std::string& answer : {std::string("\x80\x00\x00\x08garbage!", 12), std::string()}) {
        asio::io_context io;
        asio::ip::tcp::acceptor acceptor(io, {asio::ip::make_address("127.0.0.1"), 0});
        const std::uint16_t port = acceptor.local_endpoint().port();
        std::thread peer([&] {
            asio::ip::tcp::socket socket(io);
            acceptor.accept(socket);
            char request[256];
            asio::error_code ignored;
            socket.read_some(asio::buffer(request), ignored);
            asio::write(socket, asio::buffer(answer), ignored);
            std::this_thread::sleep_for(1s);
        });
        lan::Vxi11Client client("127.0.0.1", "inst0", port);
        const std::string error = errorOf([&] { client.connect(500ms); });
        peer.join();
        const std::string step = " (asking the portmapper on 127.0.0.1:" + std::to_string(port) +
                                 " for the VXI-11 core channel)";
        if (answer.empty()) {
            EXPECT_EQ(error, "no reply in 0.5 s" + step);
        } else {
            EXPECT_EQ(error.rfind("the reply is not valid RPC (", 0), 0u) << error;
            EXPECT_TRUE(error.ends_with(step)) << error;
        }
    }
}
