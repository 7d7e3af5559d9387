#include <gtest/gtest.h>

#include <limits>
#include <sstream>

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
