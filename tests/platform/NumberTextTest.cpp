#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <limits>
#include <random>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "platform/NumberText.h"

TEST(NumberText, WritesAsADefaultStreamDoes) {
    for (double value : {0.0, -30.0, 0.1, -12.3456789, 1234567.0, 999999.5, 1e9, 1.5e-5, 20e9,
                         -0.0001, 100000.0, 1e-300}) {
        std::ostringstream stream;
        stream << value;
        EXPECT_EQ(platform::generalText(value), stream.str()) << value;
    }
    std::string text = "SOUR:POW ";
    platform::appendGeneral(text, -7.25, 6);
    EXPECT_EQ(text, "SOUR:POW -7.25");
}

TEST(NumberText, ReadsTheLeadingNumberLikeAtoiAndAtof) {
    EXPECT_EQ(platform::leadingInteger("+0,\"No error\""), 0);
    EXPECT_EQ(platform::leadingInteger("-113"), -113);
    EXPECT_EQ(platform::leadingInteger(" 4\n"), 4);
    EXPECT_EQ(platform::leadingInteger("four"), 0);
    EXPECT_EQ(platform::leadingInteger("99999999999999999999"), std::numeric_limits<int>::max());
    EXPECT_EQ(platform::leadingDouble("-30.5E+0\n"), -30.5);
    EXPECT_EQ(platform::leadingDouble(""), 0.0);
    EXPECT_EQ(platform::leadingDouble("dBm"), 0.0);
}

namespace {

// Counts the values whose text differs from printf's %.<digits>g and reports the first few;
// text(value, buffer) writes a value and returns its text.
template <typename Number, typename Text>
int printfMismatches(const std::vector<Number>& values, int digits, Text text) {
    int mismatches = 0;
    char expected[64];
    char written[platform::kNumberRoom];
    for (Number value : values) {
        const auto length = static_cast<std::size_t>(
            std::snprintf(expected, sizeof expected, "%.*g", digits, static_cast<double>(value)));
        const std::string_view wanted(expected, length);
        if (text(value, written) != wanted && ++mismatches <= 10) {
            ADD_FAILURE() << "%." << digits << "g: " << wanted << " written differently";
        }
    }
    return mismatches;
}

// Both float writers against printf.
int float8Mismatches(const std::vector<float>& values) {
    std::string appended;
    return printfMismatches(values, 8,
                            [](float value, char* out) {
                                return std::string_view(out, platform::writeFloat8(out, value));
                            }) +
           printfMismatches(values, 8, [&](float value, char*) {
               appended.clear();
               platform::appendFloat8(appended, value);
               return std::string_view(appended);
           });
}

// Each float next to `value`, `count` steps either way.
void addNeighbours(std::vector<float>& values, float value, int count) {
    float below = value, above = value;
    for (int i = 0; i < count; ++i) {
        below = std::nextafter(below, -std::numeric_limits<float>::infinity());
        above = std::nextafter(above, std::numeric_limits<float>::infinity());
        values.push_back(below);
        values.push_back(above);
    }
    values.push_back(value);
}

}  // namespace

TEST(NumberText, FloatTextMatchesPrintfAtSpecialValuesAndBoundaries) {
    const float inf = std::numeric_limits<float>::infinity();
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float max = std::numeric_limits<float>::max(), min = std::numeric_limits<float>::min();
    const float denormal = std::numeric_limits<float>::denorm_min();
    std::vector<float> values = {0.0f,        -0.0f,       inf,      -inf,          nan,
                                 max,         min,         denormal, 9.9999999e-5f, 99999995.0f,
                                 1e8f,        0.0001f,     1e-5f,    12345678.0f,   0.125f,
                                 -30.123457f, 123456785.0f};
    // Powers of ten and the values that round up to them at eight digits, each with its
    // neighbours, over the whole float range.
    for (int exponent = -45; exponent <= 38; ++exponent) {
        const double power = std::pow(10.0, exponent);
        for (float edge :
             {static_cast<float>(power), static_cast<float>(power * 0.99999995),
              static_cast<float>(power * 0.999999949999), static_cast<float>(power * 1.00000005)}) {
            addNeighbours(values, edge, 4);
            addNeighbours(values, -edge, 4);
        }
    }
    // Every denormal exponent and the normal range's first binades.
    for (std::uint32_t bits = 1; bits < 0x01000000u; bits = bits * 3 + 1) {
        values.push_back(std::bit_cast<float>(bits));
    }
    // Exact ties at the ninth digit round to even: 1234567.25 -> 1234567.2, .75 -> .8.
    std::mt19937 random(7);
    for (int i = 0; i < 20000; ++i) {
        const auto whole = static_cast<float>(1000000 + random() % 3000000);
        values.push_back(whole + 0.25f);
        values.push_back(-(whole + 0.75f));
    }
    EXPECT_EQ(float8Mismatches(values), 0);
}

TEST(NumberText, FloatTextMatchesPrintfOverRandomFloats) {
    std::mt19937 random(12345);
    std::vector<float> values;
    values.reserve(1400000);
    // Any bit pattern: every exponent alike.
    for (int i = 0; i < 700000; ++i) {
        values.push_back(std::bit_cast<float>(static_cast<std::uint32_t>(random())));
    }
    // Measured-data magnitudes, from the noise floor to tens of thousands.
    std::uniform_real_distribution<double> logMagnitude(-20.0, 5.0);
    for (int i = 0; i < 700000; ++i) {
        const double magnitude = std::pow(10.0, logMagnitude(random));
        values.push_back(static_cast<float>((i & 1) != 0 ? magnitude : -magnitude));
    }
    EXPECT_EQ(float8Mismatches(values), 0);
}

TEST(NumberText, BulkGeneralTextMatchesPrintf) {
    std::mt19937_64 random(99);
    const double inf = std::numeric_limits<double>::infinity(), nan = std::nan("");
    std::vector<double> values = {999999999999999.0, 1000000000000002.0, 10000000.123456789};
    values.insert(values.end(), {0.0, -0.0, 1.0, -1.0, 1e15, 1e16, 1e17, 0.1, 2e9, 1e300, -1e-300,
                                 5e-324, inf, -inf, nan});
    std::uniform_real_distribution<double> logMagnitude(-3.0, 12.0);
    for (int i = 0; i < 60000; ++i) {
        values.push_back(std::bit_cast<double>(random()));
        const double magnitude = std::pow(10.0, logMagnitude(random));
        values.push_back(magnitude);
        values.push_back(-std::round(magnitude));  // whole frequencies
    }
    for (int digits : {15, 6, 17, 1}) {
        EXPECT_EQ(printfMismatches(values, digits,
                                   [digits](double value, char* out) {
                                       return std::string_view(
                                           out, platform::writeGeneral(out, value, digits));
                                   }),
                  0);
    }
}
