#include <gtest/gtest.h>

#include "ScpiErrorCode.h"
#include "scpi/Block.h"

namespace {

using namespace std::literals;
using scpitest::scpiErrorOf;

TEST(ScpiBlock, RoundTripsAndWaitsForACompleteHeader) {
    for (std::size_t size : {0u, 10u, 1000000u}) {
        std::string block;
        scpi::appendBlock(block, std::string(size, '\n'));
        auto header = scpi::readBlockHeader(block);
        ASSERT_TRUE(header);
        EXPECT_EQ(block.size(), header->headerBytes + size);
        EXPECT_EQ(size, header->dataBytes);
        for (std::size_t cut = 1; cut < header->headerBytes; ++cut) {
            EXPECT_FALSE(scpi::readBlockHeader(block.substr(0, cut)));
        }
    }
    std::string out;
    EXPECT_EQ("-223: Too much data; a block of 1000000000 bytes does not fit a 9-digit length",
              scpiErrorOf([&] { scpi::appendBlockHeader(out, 1000000000); }));
}

// The limit is checked on the header alone: there is no data here to allocate for.
TEST(ScpiBlock, RefusesBadHeadersAndLengthsOverTheLimit) {
    const std::pair<const char*, const char*> cases[] = {
        {"#0abc", "indefinite-length block #0 is not accepted, send a definite-length block"},
        {"#x12", "# must be followed by the digit count 1 to 9"},
        {"#31x", "the length has 3 digits but character 2 of it is not a digit"},
        {"#867108865", "block announces 67108865 bytes, more than the limit of 67108864 bytes"},
    };
    for (auto [text, error] : cases) {
        EXPECT_EQ("-161: Invalid block data; "s + error,
                  scpiErrorOf([&] { scpi::readBlockHeader(text); }));
    }
    EXPECT_TRUE(scpi::readBlockHeader("#867108864"));
}

TEST(ScpiBlock, UnitsAndParametersSkipBlocksWhateverBytesTheyHold) {
    const std::pair<std::string_view, std::vector<std::string_view>> units[] = {
        {"DATA #15a;\"\nb;*OPC?", {"DATA #15a;\"\nb", "*OPC?"}},
        {"DATA #14'\0; ;X"sv, {"DATA #14'\0; "sv, "X"}},
        // Blanks ending a block are data.
        {" D #13a \n ; E #11  ;", {"D #13a \n", "E #11 "}},
        // A block cut short runs to the end; hexadecimal numbers and bad headers are text.
        {"A #HFF;B #0;C #2x;D #15ab;c", {"A #HFF", "B #0", "C #2x", "D #15ab;c"}},
    };
    for (const auto& [message, expected] : units) {
        EXPECT_EQ(expected, scpi::splitMessageUnits(message)) << message;
    }

    scpi::ParameterReader r(" #210a,b\n\"c'd\"e , 'x', #10");
    EXPECT_EQ("a,b\n\"c'd\"e", r.block());
    EXPECT_EQ("x", r.string());
    EXPECT_EQ("", r.block());
    EXPECT_NO_THROW(r.finish());
    const std::pair<const char*, const char*> errors[] = {
        {"12", "-104: Data type error; block expected"},
        {"#15abc", "-161: Invalid block data; block announces 5 bytes but only 3 follow"},
        {"#3", "-161: Invalid block data; the block header is cut short"},
        {"#12ab x", "-103: Invalid separator"},
    };
    for (auto [parameters, error] : errors) {
        scpi::ParameterReader reader(parameters);
        EXPECT_EQ(error, scpiErrorOf([&] { reader.block(); })) << parameters;
    }
}

}  // namespace
