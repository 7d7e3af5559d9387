#include <gtest/gtest.h>

#include <random>

#include "ErrorOf.h"
#include "RpcTestClient.h"
#include "lan/OncRpc.h"
#include "lan/RecordMarking.h"

using lantest::callRecord;
using lantest::words;
using testsupport::errorOf;

namespace {

std::string mark(std::uint32_t word) {
    return words({word});
}

}  // namespace

TEST(RpcCodec, XdrRoundTripAndBoundsChecks) {
    std::string bytes;
    lan::XdrWriter writer(bytes);
    writer.u32(0xDEADBEEF);
    writer.i32(-2);
    writer.boolean(true);
    writer.opaque("abcde");
    writer.opaque("");
    ASSERT_EQ(bytes.size(), 4u * 3 + 4 + 8 + 4);

    lan::XdrReader reader(bytes);
    EXPECT_EQ(reader.u32("a"), 0xDEADBEEFu);
    EXPECT_EQ(reader.i32("b"), -2);
    EXPECT_TRUE(reader.boolean("c"));
    EXPECT_EQ(reader.opaque("d"), "abcde");
    EXPECT_EQ(reader.opaque("e"), "");
    EXPECT_EQ(reader.remaining(), 0u);
    EXPECT_EQ(errorOf([&] { reader.u32("link"); }), "XDR data ends before link");

    // A length field that lies, or exceeds the field's bound, never reads past the data.
    const std::string lying = words({1000}) + "abcd";
    EXPECT_EQ(errorOf([&] { lan::XdrReader(lying).opaque("data"); }),
              "XDR data announces 1000 bytes but only 4 remain");
    EXPECT_EQ(errorOf([&] { lan::XdrReader(lying).opaque("handle", 40); }),
              "XDR handle of 1000 bytes exceeds its bound of 40");
    const std::string two = words({2});
    EXPECT_EQ(errorOf([&] { lan::XdrReader(two).boolean("enable"); }), "XDR boolean enable is 2");
}

TEST(RpcCodec, RecordsReassembleFromFragmentsAndAnyPieces) {
    // Two fragments of one record, then a second record of one fragment.
    const std::string stream =
        mark(3) + "abc" + mark(0x80000002u) + "de" + mark(0x80000000u) + mark(0x80000001u) + "z";
    for (const std::size_t piece : {std::size_t{1}, std::size_t{3}, stream.size()}) {
        lan::RecordReader reader(100);
        std::vector<std::string> records;
        for (std::size_t at = 0; at < stream.size(); at += piece) {
            std::string_view chunk = std::string_view(stream).substr(at, piece);
            while (!chunk.empty()) {
                chunk.remove_prefix(reader.feed(chunk));
                if (reader.complete()) {
                    records.emplace_back(reader.record());
                    reader.next();
                }
            }
        }
        // The empty last fragment completes its record without payload.
        EXPECT_EQ(records, (std::vector<std::string>{"abcde", "", "z"}))
            << "pieces of " << piece << " bytes";
    }
}

TEST(RpcCodec, RecordOverTheLimitFailsBeforeItsBytesArrive) {
    lan::RecordReader reader(1000);
    EXPECT_EQ(reader.feed(mark(600) + "x"), 5u);
    EXPECT_EQ(errorOf([&] { reader.feed(std::string(599, 'x') + mark(0x80000000u | 401)); }),
              "RPC record of more than 1001 bytes exceeds the limit of 1000");
    // A huge announced length is refused from the mark alone.
    lan::RecordReader fresh(1000);
    EXPECT_EQ(errorOf([&] { fresh.feed(mark(0xFFFFFFFFu)); }),
              "RPC record of more than 2147483647 bytes exceeds the limit of 1000");
}

TEST(RpcCodec, CallsAndRepliesRoundTrip) {
    const std::string record = callRecord(42, 100000, 2, 3, words({0x0607AF, 1, 6, 0}));
    lan::RecordReader reader(1000);
    reader.feed(record);
    ASSERT_TRUE(reader.complete());
    lan::XdrReader call(reader.record());
    const lan::rpc::Call header = lan::rpc::readCall(call);
    EXPECT_EQ(header.xid, 42u);
    EXPECT_EQ(header.program, 100000u);
    EXPECT_EQ(header.version, 2u);
    EXPECT_EQ(header.procedure, 3u);
    EXPECT_EQ(call.u32("program"), 0x0607AFu);

    std::string reply = lan::rpc::beginReply(42, lan::rpc::AcceptStat::Success);
    lan::XdrWriter(reply).u32(1234);
    lan::XdrReader replyReader(std::string_view(reply).substr(4));
    lan::rpc::readReply(replyReader, 42);
    EXPECT_EQ(replyReader.u32("port"), 1234u);

    const std::string refused =
        lan::rpc::beginReply(9, lan::rpc::AcceptStat::ProgramMismatch, 1).substr(4);
    EXPECT_EQ(errorOf([&] {
                  lan::XdrReader r(refused);
                  lan::rpc::readReply(r, 9);
              }),
              "RPC call not accepted (accept status 2)");
    const std::string notCall = words({1, 1, 2});
    EXPECT_EQ(errorOf([&] {
                  lan::XdrReader r(notCall);
                  lan::rpc::readCall(r);
              }),
              "RPC message type 1 is not a call");
}

TEST(RpcCodec, RandomBytesRaiseOnlyProtocolErrors) {
    std::mt19937 random(12);
    for (int round = 0; round < 3000; ++round) {
        std::string bytes(random() % 200, '\0');
        for (auto& byte : bytes) {
            byte = static_cast<char>(random());
        }
        // Half the rounds start like a call, so the parsers get past the first words.
        if (round % 2 == 0 && bytes.size() > 12) {
            bytes.replace(0, 12, words({static_cast<std::uint32_t>(round), 0, 2}));
        }
        lan::RecordReader records(1u << 16);
        try {
            const std::string framed =
                mark(0x80000000u | static_cast<std::uint32_t>(bytes.size())) + bytes;
            records.feed(framed);
            ASSERT_TRUE(records.complete());
            lan::XdrReader reader(records.record());
            lan::rpc::readCall(reader);
            while (reader.remaining() > 0) {
                reader.opaque("data", 1u << 16);
            }
        } catch (const lan::ProtocolError&) {
        }
        lan::RecordReader raw(1u << 16);
        try {
            raw.feed(bytes);
        } catch (const lan::ProtocolError&) {
        }
    }
}
