#include <gtest/gtest.h>

#include <algorithm>
#include <future>
#include <thread>

#include "FakeDevice.h"
#include "RpcTestClient.h"
#include "lan/Vxi11.h"
#include "lan/Vxi11Server.h"

using namespace lantest;
namespace vxi11 = lan::vxi11;

namespace {

class ThreadedVxi11 : public ::testing::Test {
  protected:
    ThreadedVxi11() : server(context, device, asio::ip::make_address("127.0.0.1"), options()) {}

    static lan::Vxi11Server::Options options() {
        lan::Vxi11Server::Options options;
        options.maxReceiveSize = 4096;
        options.maxLinks = 4;
        return options;
    }

    Vxi11TestClient linked() {
        Vxi11TestClient client(server.corePort());
        EXPECT_EQ(client.createLink(), 0u);
        return client;
    }

    std::string query(Vxi11TestClient& client, const std::string& message) {
        EXPECT_EQ(client.write(message + "\n"), 0u);
        return client.readAll();
    }

    FakeDevice device;
    lan::ServerContext context{2};
    lan::Vxi11Server server;
};

}  // namespace

TEST_F(ThreadedVxi11, WritesAndReadsHonourSizesFlagsAndTimeouts) {
    Vxi11TestClient client(server.corePort());
    ASSERT_EQ(client.createLink(), 0u);
    EXPECT_EQ(client.abortPort, server.abortPort());
    EXPECT_EQ(client.maxReceiveSize, 4096u);
    EXPECT_EQ(query(client, "*IDN?"), "FAKE,LAN-TEST,0,1.0\n");

    // Reads never exceed the requested size; END only on the last piece.
    ASSERT_EQ(client.write("BLOCK? 1000\n"), 0u);
    std::string block;
    for (;;) {
        const Vxi11Read piece = client.read(300);
        ASSERT_EQ(piece.error, 0u);
        ASSERT_LE(piece.data.size(), 300u);
        block += piece.data;
        if (piece.reason == vxi11::reasonEnd) {
            break;
        }
        ASSERT_EQ(piece.reason, vxi11::reasonRequestCount);
    }
    EXPECT_EQ(block, FakeDevice::blockReply(1000) + "\n");

    // A write larger than the advertised size, and one ending in NL without END.
    const std::string big = "DATA #6100000" + std::string(100000, '\n');
    EXPECT_EQ(client.write(big, 0), 0u);
    EXPECT_EQ(client.write("\n", 0), 0u);
    EXPECT_EQ(query(client, "ECHO? after"), "after\n");
    EXPECT_EQ(device.executed().at(device.executed().size() - 2).size(), big.size());

    // END closes a message that has no NL; END inside a block drops it with an error.
    EXPECT_EQ(client.write("ECHO? ended", vxi11::flagEnd), 0u);
    EXPECT_EQ(client.readAll(), "ended\n");
    EXPECT_EQ(client.write("DATA #15ab", vxi11::flagEnd), 0u);
    EXPECT_EQ(query(client, "SYST:ERR?").substr(0, 5), "-160,");

    // Nothing to read: error 15 once the I/O timeout has passed, not before.
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(client.read(100, 300).error, vxi11::ioTimeout);
    EXPECT_GE(std::chrono::steady_clock::now() - start, 290ms);
}

TEST_F(ThreadedVxi11, NewQueryDiscardsUnreadResponseWithError) {
    Vxi11TestClient client = linked();
    ASSERT_EQ(client.write("ECHO? first\n"), 0u);
    std::this_thread::sleep_for(50ms);
    ASSERT_EQ(client.write("ECHO? second\n"), 0u);
    EXPECT_EQ(client.readAll(), "second\n");
    EXPECT_EQ(query(client, "SYST:ERR?"), "-410,\"Query INTERRUPTED\"\n");
}

TEST_F(ThreadedVxi11, StatusByteClearTriggerAndUnsupportedCalls) {
    Vxi11TestClient client = linked();
    ASSERT_EQ(client.write("ECHO? unread\n"), 0u);
    auto status = client.readStb();
    for (int i = 0; i < 200 && status.second == 0; ++i) {
        std::this_thread::sleep_for(10ms);
        status = client.readStb();
    }
    EXPECT_EQ(status, std::make_pair(0u, 0x10u));  // MAV once the response is made

    EXPECT_EQ(client.generic(vxi11::deviceClear), 0u);
    EXPECT_EQ(device.clears(), 1);
    EXPECT_EQ(client.read(100, 100).error, vxi11::ioTimeout);  // the response went with it
    EXPECT_EQ(client.readStb(), std::make_pair(0u, 0u));

    EXPECT_EQ(client.generic(vxi11::deviceTrigger), 0u);
    EXPECT_EQ(client.generic(vxi11::deviceRemote), 0u);
    EXPECT_EQ(client.generic(vxi11::deviceLocal), 0u);
    EXPECT_EQ(query(client, "*IDN?"), "FAKE,LAN-TEST,0,1.0\n");
    const auto executed = device.executed();
    EXPECT_EQ(std::count(executed.begin(), executed.end(), "*TRG"), 1);

    EXPECT_EQ(client.errorOf(vxi11::deviceDocmd, words({client.link, 0, 0, 0, 1, 0, 0, 0})),
              vxi11::operationNotSupported);
    EXPECT_EQ(client.errorOf(vxi11::createInterruptChannel, words({0, 0, 0, 0, 0})),
              vxi11::operationNotSupported);
    EXPECT_EQ(client.errorOf(vxi11::deviceEnableSrq, words({client.link, 1, 0})), 0u);
    EXPECT_EQ(client.errorOf(vxi11::deviceEnableSrq, words({999, 1, 0})), vxi11::invalidLink);
}

TEST_F(ThreadedVxi11, LockIsHonouredAcrossLinks) {
    Vxi11TestClient owner = linked();
    Vxi11TestClient other = linked();
    EXPECT_EQ(owner.lock(), 0u);
    EXPECT_EQ(other.lock(), vxi11::deviceLocked);
    EXPECT_EQ(other.unlock(), vxi11::noLockHeld);

    // Without waitlock another link is refused at once; with it, it waits the lock timeout.
    EXPECT_EQ(other.write("CMD 1\n", vxi11::flagEnd), vxi11::deviceLocked);
    auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(other.write("CMD 2\n", vxi11::flagEnd | vxi11::flagWaitLock, 2000, 300),
              vxi11::deviceLocked);
    EXPECT_GE(std::chrono::steady_clock::now() - start, 290ms);
    EXPECT_EQ(other.read(100, 100, vxi11::flagWaitLock, 100).error, vxi11::deviceLocked);
    EXPECT_EQ(query(owner, "ECHO? mine"), "mine\n");

    // A waiting write goes through as soon as the lock is released.
    auto waiting = std::async(std::launch::async, [&] {
        return other.write("ECHO? waited\n", vxi11::flagEnd | vxi11::flagWaitLock, 5000, 5000);
    });
    std::this_thread::sleep_for(100ms);
    EXPECT_EQ(owner.unlock(), 0u);
    EXPECT_EQ(waiting.get(), 0u);
    EXPECT_EQ(other.readAll(), "waited\n");

    // A link that goes away gives up its lock.
    EXPECT_EQ(other.lock(), 0u);
    EXPECT_EQ(other.destroyLink(), 0u);
    EXPECT_EQ(other.destroyLink(), vxi11::invalidLink);
    EXPECT_EQ(owner.lock(), 0u);
    Vxi11TestClient third(server.corePort());
    EXPECT_EQ(third.createLink(true, 100), vxi11::deviceLocked);
    third.rpc.socket().close();
    EXPECT_EQ(owner.unlock(), 0u);
}

TEST_F(ThreadedVxi11, AbortAnsweredWhileCoreCallsWait) {
    Vxi11TestClient client = linked();
    // A read waiting for a response that a blocked instrument has not made.
    ASSERT_EQ(client.write("WAIT?\n"), 0u);
    auto reading = std::async(std::launch::async, [&] { return client.read(100, 20000).error; });
    std::this_thread::sleep_for(100ms);
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(abortLink(client.abortPort, client.link), 0u);
    EXPECT_EQ(reading.get(), vxi11::aborted);
    EXPECT_LT(std::chrono::steady_clock::now() - start, 2s);
    EXPECT_EQ(abortLink(client.abortPort, 999), vxi11::invalidLink);

    // The instrument still finishes the query; its response is there to read.
    device.release();
    EXPECT_EQ(client.readAll(), "1\n");
}

TEST_F(ThreadedVxi11, LinksAreBoundedAndFreedWhenClientsLeave) {
    std::vector<Vxi11TestClient> clients;
    for (int i = 0; i < 4; ++i) {
        clients.push_back(linked());
    }
    Vxi11TestClient extra(server.corePort());
    EXPECT_EQ(extra.createLink(), vxi11::outOfResources);
    EXPECT_EQ(extra.createLink(false, 0, "gpib0,7"), vxi11::invalidAddress);
    clients.front().rpc.socket().close();  // no destroy_link: the server cleans up
    std::uint32_t error = vxi11::outOfResources;
    for (int attempt = 0; attempt < 50 && error != 0; ++attempt) {
        std::this_thread::sleep_for(20ms);
        error = extra.createLink();
    }
    EXPECT_EQ(error, 0u);
    EXPECT_EQ(query(extra, "ECHO? new link"), "new link\n");
}

TEST_F(ThreadedVxi11, MalformedRecordsCloseOnlyTheirConnection) {
    Vxi11TestClient good = linked();

    TestSocket huge(server.corePort());
    huge.send(words({0x80000000u | 0x7FFFFFFF}));
    EXPECT_TRUE(huge.closedWithin(2s));

    TestSocket notCall(server.corePort());
    notCall.send(words({0x80000000u | 12, 1, 1, 0}));  // a "reply"
    EXPECT_TRUE(notCall.closedWithin(2s));

    // Arguments that lie about their length are garbage; the connection goes on.
    RpcTestClient lying(server.corePort(), vxi11::coreProgram, vxi11::version);
    const std::string reply = lying.callRaw(vxi11::deviceWrite, words({1, 0, 0, 8, 1000}));
    EXPECT_EQ(lan::XdrReader(std::string_view(reply).substr(20)).u32("accept status"), 4u);
    EXPECT_EQ(lying.callRaw(99, "").substr(20, 4), words({3}));  // no such procedure

    EXPECT_EQ(query(good, "*IDN?"), "FAKE,LAN-TEST,0,1.0\n");
}
