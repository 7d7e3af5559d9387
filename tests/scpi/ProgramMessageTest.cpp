#include <gtest/gtest.h>

#include "scpi/ErrorQueue.h"
#include "scpi/ProgramMessage.h"

namespace {

TEST(ScpiSyntax, SplitsUnitsOutsideQuotesAndReadsHeaders) {
    EXPECT_EQ((std::vector<std::string_view>{"*IDN?", "SENS:PATH:CONF:ELEM \"a;b\",\"c\""}),
              scpi::splitMessageUnits(" *IDN? ; SENS:PATH:CONF:ELEM \"a;b\",\"c\";"));

    auto header = scpi::parseHeader(":SENSe1:AVERage:COUNt 5");
    EXPECT_FALSE(header.query);
    EXPECT_EQ((std::vector<std::string_view>{"SENSe1", "AVERage", "COUNt"}), header.nodes);
    EXPECT_EQ(" 5", header.parameters);
    EXPECT_TRUE(scpi::parseHeader("SYST:ERR?").query);
    EXPECT_THROW(scpi::parseHeader("SENS::AVER"), scpi::Error);
}

TEST(ScpiSyntax, ReadsParametersInEverySciForm) {
    scpi::ParameterReader r(R"( +1.5E+3 , 2GHz, 'it''s', ON, 0, nbf , -30 dBm)");
    EXPECT_DOUBLE_EQ(1500.0, r.number());
    EXPECT_DOUBLE_EQ(2e9, r.number());
    EXPECT_EQ("it's", r.string());
    EXPECT_TRUE(r.boolean());
    EXPECT_FALSE(r.boolean());
    EXPECT_EQ("NBF", r.word());
    EXPECT_DOUBLE_EQ(-30.0, r.number());
    EXPECT_TRUE(r.atEnd());
    EXPECT_NO_THROW(r.finish());

    auto code = [](const char* text, auto read) {
        scpi::ParameterReader reader(text);
        try {
            read(reader);
        } catch (const scpi::Error& e) {
            return e.code;
        }
        return 0;
    };
    EXPECT_EQ(-104, code("12", [](auto& r) { r.string(); }));
    EXPECT_EQ(-151, code("\"open", [](auto& r) { r.string(); }));
    EXPECT_EQ(-109, code("", [](auto& r) { r.number(); }));
    EXPECT_EQ(-109, code("1,", [](auto& r) { r.number(), r.number(); }));
    EXPECT_EQ(-131, code("5 furlongs", [](auto& r) { r.number(); }));
    EXPECT_EQ(-222, code("inf GHz", [](auto& r) { r.number(); }));
    EXPECT_EQ(-224, code("maybe", [](auto& r) { r.boolean(); }));
}

TEST(ErrorQueue, ReportsOverflowInTheLastPlace) {
    scpi::ErrorQueue q;
    for (int i = 0; i < 150; ++i) {
        q.push(-100, "Command error");
    }
    EXPECT_EQ(scpi::ErrorQueue::capacity, q.size());
    for (std::size_t i = 0; i + 1 < scpi::ErrorQueue::capacity; ++i) {
        q.pop();
    }
    EXPECT_EQ("-350,\"Queue overflow\"", q.pop());
}

}  // namespace
