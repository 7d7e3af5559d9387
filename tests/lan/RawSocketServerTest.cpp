#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <thread>

#include "FakeDevice.h"
#include "TestSocket.h"
#include "lan/RawSocketServer.h"

using namespace lantest;

namespace {

class ThreadedRawSocket : public ::testing::Test {
  protected:
    ThreadedRawSocket()
        : server(context, device, {asio::ip::make_address("127.0.0.1"), 0},
                 {std::chrono::milliseconds(100), 4096}) {}

    TestSocket connect() { return TestSocket(server.port()); }

    bool executed(const std::string& message) {
        const auto all = device.executed();
        return std::find(all.begin(), all.end(), message) != all.end();
    }

    FakeDevice device;
    lan::ServerContext context{2};
    lan::RawSocketServer server;
};

}  // namespace

TEST_F(ThreadedRawSocket, FramesMessagesHoweverTheyArrive) {
    TestSocket client = connect();
    // Several messages in one segment, a command among them, CR LF on one.
    client.send("*IDN?\nCMD 1\nECHO? a;b\r\nECHO? \"x\ny\"\n");
    EXPECT_EQ(client.line(), "FAKE,LAN-TEST,0,1.0");
    EXPECT_EQ(client.line(), "a;b");
    EXPECT_EQ(client.line(), "\"x");  // the fake echoes the text with the NL in its string
    EXPECT_EQ(client.line(), "y\"");

    // One message over many segments.
    for (const char byte : std::string("ECHO? split\n")) {
        client.send(std::string(1, byte));
    }
    EXPECT_EQ(client.line(), "split");

    // No terminator: the message runs after the idle gap, and not before.
    client.send("ECHO? unterminated");
    EXPECT_FALSE(client.anythingWithin(40ms));
    EXPECT_EQ(client.line(1s), "unterminated");

    // A block whose bytes hold NL and CR reaches the device whole.
    client.send("DATA #15a\n\r;\"\n*IDN?\n");
    EXPECT_EQ(client.line(), "FAKE,LAN-TEST,0,1.0");
    EXPECT_TRUE(executed("DATA #15a\n\r;\""));
}

TEST_F(ThreadedRawSocket, BinaryBlockRepliesEndWithNewline) {
    TestSocket client = connect();
    client.send("BLOCK? 3000\nBLOCK? 10\n");
    const std::string first = FakeDevice::blockReply(3000);
    EXPECT_EQ(client.receive(first.size() + 1), first + "\n");
    const std::string second = FakeDevice::blockReply(10);
    EXPECT_EQ(client.receive(second.size() + 1), second + "\n");
}

TEST_F(ThreadedRawSocket, MessageCutOffByDisconnectNeverRuns) {
    {
        TestSocket client = connect();
        client.send("CMD whole\nCMD cut");
    }
    {
        TestSocket client = connect();
        client.send("DATA #19short\n");  // the NL is block data: still 3 bytes short
    }
    TestSocket witness = connect();
    std::this_thread::sleep_for(300ms);  // past the idle gap
    witness.send("*IDN?\n");
    witness.line();
    EXPECT_TRUE(executed("CMD whole"));
    EXPECT_FALSE(executed("CMD cut"));
    for (const auto& message : device.executed()) {
        EXPECT_NE(message.rfind("DATA", 0), 0u) << message;
    }
}

TEST_F(ThreadedRawSocket, ClientsAtOnceEachGetTheirOwnAnswersInOrder) {
    constexpr int clients = 8;
    constexpr int queries = 200;
    std::vector<std::thread> threads;
    std::vector<int> correct(clients, 0);
    for (int c = 0; c < clients; ++c) {
        threads.emplace_back([&, c] {
            TestSocket client = connect();
            // Pipelined in batches, so that segments carry several queries.
            for (int q = 0; q < queries; q += 10) {
                std::string batch;
                for (int i = q; i < q + 10; ++i) {
                    batch += "ECHO? " + std::to_string(c) + "-" + std::to_string(i) + "\n";
                }
                client.send(batch);
                for (int i = q; i < q + 10; ++i) {
                    correct[c] += client.line() == std::to_string(c) + "-" + std::to_string(i);
                }
            }
        });
    }
    for (auto& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(correct, std::vector<int>(clients, queries));
}

TEST_F(ThreadedRawSocket, BlockingQueryHoldsUpNoAcceptOrRead) {
    TestSocket blocked = connect();
    blocked.send("WAIT?\n");
    for (int i = 0; i < 500 && !executed("WAIT?"); ++i) {
        std::this_thread::sleep_for(10ms);
    }
    ASSERT_TRUE(executed("WAIT?"));
    // While the instrument is busy, new clients connect and their input is taken in.
    TestSocket other = connect();
    other.send("ECHO? " + std::string(3000, 'q') + "\n");
    EXPECT_FALSE(other.anythingWithin(100ms));
    device.release();
    EXPECT_EQ(blocked.line(), "1");
    EXPECT_EQ(other.line().size(), 3000u);
}

TEST_F(ThreadedRawSocket, BadInputGetsErrorsAndOthersAreServed) {
    TestSocket bad = connect();
    TestSocket good = connect();
    // Over the 4096-byte message limit, then a block announcing more than any limit.
    bad.send(std::string(10000, 'X') + "\n*IDN?\n");
    EXPECT_EQ(bad.line(), "FAKE,LAN-TEST,0,1.0");
    bad.send("DATA #9999999999\n*IDN?\n");
    EXPECT_EQ(bad.line(), "FAKE,LAN-TEST,0,1.0");
    bad.send("SYST:ERR?\nSYST:ERR?\n");
    EXPECT_EQ(bad.line().substr(0, 5), "-223,");
    EXPECT_EQ(bad.line().substr(0, 5), "-161,");

    // Binary noise: whatever it causes stays on its connection.
    std::mt19937 random(5);
    std::string noise(200000, '\0');
    for (auto& byte : noise) {
        byte = static_cast<char>(random());
    }
    bad.send(noise);
    good.send("ECHO? still here\n");
    EXPECT_EQ(good.line(), "still here");
}

TEST_F(ThreadedRawSocket, ClientLeavingMidResponseDisturbsNoOther) {
    {
        // Larger than the socket buffers, so the server is still writing when it leaves.
        TestSocket leaving = connect();
        leaving.send("BLOCK? 4000000\n");
        leaving.receive(1000, 60s);
    }
    TestSocket other = connect();
    other.send("*IDN?\n");
    EXPECT_EQ(other.line(60s), "FAKE,LAN-TEST,0,1.0");
}

TEST_F(ThreadedRawSocket, StopClosesEveryConnection) {
    TestSocket idle = connect();
    TestSocket busy = connect();
    busy.send("*IDN?\n");
    busy.line();
    const std::uint16_t port = server.port();
    context.stop();
    EXPECT_TRUE(idle.closedWithin(1s));
    EXPECT_TRUE(busy.closedWithin(1s));
    EXPECT_THROW(TestSocket{port}, std::runtime_error);
}
