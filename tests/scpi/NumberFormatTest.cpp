#include <gtest/gtest.h>

#include <bit>
#include <cfloat>
#include <cmath>
#include <cstdio>
#include <random>

#include "ScpiErrorCode.h"
#include "scpi/NumberFormat.h"

namespace {

using scpi::ByteOrder;
using scpi::DataFormat;
using scpitest::scpiErrorOf;

TEST(ScpiNumbers, Nr3IsPrintfByteForByte) {
    // Ties at the 13th digit, a carry into the exponent, denormals, infinities, NaNs.
    std::vector<double> values = {
        0.0,      -0.0,      100000000000.5, 999999999999.5, 1e300,
        DBL_MAX,  DBL_MIN,   DBL_TRUE_MIN,   -25.0,          -DBL_TRUE_MIN * 12345,
        HUGE_VAL, -HUGE_VAL, std::nan(""),   -std::nan("")};
    std::mt19937_64 random(20240607);
    std::uniform_real_distribution<double> mantissa(-10.0, 10.0);
    for (int i = 0; i < 100000; ++i) {
        values.push_back(std::bit_cast<double>(random()));
        values.push_back(mantissa(random) * std::pow(10.0, static_cast<int>(random() % 629) - 320));
    }
    std::string expected;
    for (double value : values) {
        char nr3[64];
        std::snprintf(nr3, sizeof nr3, "%+.11E", value);
        std::string ours;
        scpi::appendNr3(ours, value);
        ASSERT_EQ(nr3, ours);
        expected += (expected.empty() ? "" : ",") + ours;
    }
    std::string joined;
    scpi::appendValues(joined, values, DataFormat::Ascii, ByteOrder::Normal);
    EXPECT_EQ(expected, joined);
}

TEST(ScpiNumbers, RealBlocksRoundTripInBothByteOrders) {
    const std::vector<double> values = {1.0, -2.5e-12, 1e300, 6e9, HUGE_VAL};
    const std::vector<float> floats(values.begin(), values.end());
    for (auto order : {ByteOrder::Normal, ByteOrder::Swapped}) {
        std::string real64;
        scpi::appendValues(real64, values, DataFormat::Real64, order);
        EXPECT_EQ(values, scpi::decodeValues(real64 + "\r\n", DataFormat::Real64, order));
        std::string real32;
        std::string narrowed;
        scpi::appendValues(real32, floats, DataFormat::Real32, order);
        scpi::appendValues(narrowed, values, DataFormat::Real32, order);
        EXPECT_EQ(real32, narrowed);
        EXPECT_EQ(std::vector<double>(floats.begin(), floats.end()),
                  scpi::decodeValues(real32, DataFormat::Real32, order));
    }
    // NORM is big-endian.
    std::string one;
    scpi::appendValues(one, std::vector<double>{1.0}, DataFormat::Real64, ByteOrder::Normal);
    scpi::appendValues(one, std::vector<float>{1.0f}, DataFormat::Real32, ByteOrder::Swapped);
    EXPECT_EQ(std::string("#18\x3f\xf0\0\0\0\0\0\0#14\0\0\x80\x3f", 18), one);
}

TEST(ScpiNumbers, DecodesAsciiInAnyNumericFormAndNamesWhatIsWrong) {
    EXPECT_EQ((std::vector<double>{1500, -2, 0.25, 255, 15, 5}),
              scpi::decodeValues(" +1.5E+3,-2, .25 ,#HFF,#q17,#B101\n", DataFormat::Ascii,
                                 ByteOrder::Normal));
    const std::tuple<std::string, DataFormat, const char*> cases[] = {
        {"1,,2", DataFormat::Ascii, "-104: Data type error; value 2 (\"\") is not a number"},
        {"+-1", DataFormat::Ascii, "-104: Data type error; value 1 (\"+-1\") is not a number"},
        {"#210" + std::string(10, 'x'), DataFormat::Real64,
         "-161: Invalid block data; block of 10 bytes is not a whole number of 8-byte values"},
        {"#14abc", DataFormat::Real32,
         "-161: Invalid block data; block announces 4 bytes but only 3 arrived"},
        {"#14abcd;", DataFormat::Real32,
         "-161: Invalid block data; 1 bytes follow the block of 4 bytes"},
        {"1.0", DataFormat::Real32,
         "-104: Data type error; a REAL,32 response is a block starting with #"},
    };
    for (const auto& [response, format, error] : cases) {
        EXPECT_EQ(error,
                  scpiErrorOf([&] { scpi::decodeValues(response, format, ByteOrder::Normal); }))
            << response;
    }
}

}  // namespace
