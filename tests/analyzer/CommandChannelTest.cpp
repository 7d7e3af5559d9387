#include "ProxyFixture.h"

using ::testing::ElementsAre;
using ::testing::HasSubstr;

TEST_F(ProxyTest, EveryCommandWaitsAndReturnsTheWholeReply) {
    auto proxy = connect();
    const std::string longReply(60000, '7');
    fake.parser->reply("DIAG:flasharray? \"RCVRCHAR\",\"A\"", {longReply});
    EXPECT_EQ(proxy->sendscpi("DIAG:flasharray? \"RCVRCHAR\",\"A\""), longReply);
    EXPECT_EQ(proxy->sendscpi("SENS:AVER:CLE"), "");
    EXPECT_EQ(clock.totalWaited().count(), 100);

    // A failing parser is not mistaken for an empty reply; the pause is kept all the same.
    fake.parser->failingCommand = "*IDN?";
    EXPECT_EQ(errorOf([&] { proxy->readmodel(true); }), "link to the analyzer lost");
    EXPECT_EQ(clock.totalWaited().count(), 150);
}

TEST_F(ProxyTest, ErrorQueueIsDrainedToTheLastCode) {
    auto proxy = connect();
    std::string errors = "stale";
    EXPECT_EQ(proxy->checkerrors(errors), 0);
    EXPECT_EQ(errors, "");
    EXPECT_THAT(fake.log->scpi(), ElementsAre("SYST:ERR?"));

    fake.log->clear();
    fake.parser->reply("SYST:ERR?", {"-113,\"Undefined header\"", "-222,\"Data out of range\"",
                                     "+0,\"No error\""});
    EXPECT_EQ(proxy->checkerrors(errors), -222);
    EXPECT_EQ(errors, ",\"Undefined header\"\n,\"Data out of range\"");
    EXPECT_EQ(fake.log->scpi().size(), 3u);

    // A code that is not a number ends the drain as an empty queue would.
    fake.parser->reply("SYST:ERR?", {"-100,\"Command error\"", "none,\"?\""});
    EXPECT_EQ(proxy->checkerrors(errors), -100);
    EXPECT_EQ(errors, ",\"Command error\"");
}

TEST_F(ProxyTest, BrokenErrorQueueRaisesInsteadOfLooping) {
    auto proxy = connect();
    std::string errors;
    fake.parser->reply("SYST:ERR?", {"No error"});
    EXPECT_EQ(errorOf([&] { proxy->checkerrors(errors); }),
              "CNetworkAnalyzer::checkerrors cannot read the SYST:ERR? reply \"No error\" (code, "
              "comma, message expected)");

    fake.log->clear();
    fake.parser->reply("SYST:ERR?", {"-350,\"Queue overflow\""});
    const std::string text = errorOf([&] { proxy->checkerrors(errors); });
    EXPECT_THAT(text, HasSubstr("gave up after 1000 entries"));
    EXPECT_THAT(text, HasSubstr(",\"Queue overflow\""));
    EXPECT_EQ(fake.log->scpi().size(), 1000u);
}
