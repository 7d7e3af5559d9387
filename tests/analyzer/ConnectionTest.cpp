#include "ProxyFixture.h"

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::IsEmpty;

TEST_F(ProxyTest, ConstructionFailurePaths) {
    // No back end answers the host name.
    EXPECT_EQ(errorOf([&] { CNetworkAnalyzer("nowhere", ui, clock); }),
              "The software driver\r\nassociated with that com object was not found or could "
              "not be properly loaded.");

    // A back end whose object is not an application.
    fakeanalyzer::BackendRegistration plain("plain", std::make_shared<automation::Object>());
    ui.answerAll(platform::Answer::Ok);
    CNetworkAnalyzer orphan("plain", ui, clock);
    EXPECT_TRUE(orphan.quitRequested());
    ASSERT_EQ(ui.boxes().size(), 1u);
    EXPECT_EQ(ui.boxes()[0].box.text, "Unable to create COM object for TVA Application plain");
    EXPECT_EQ(ui.boxes()[0].box.caption, "Critical Error");
    EXPECT_EQ(errorOf([&] { orphan.preparecal(); }), "m_pTVAap != NULL");
    EXPECT_EQ(errorOf([&] { orphan.readportcount(true); }), "m_pTVAap != NULL");

    // An application without a parser: usable object, but no command can be sent.
    fake.application->parser = nullptr;
    auto mute = connect();
    EXPECT_FALSE(mute->quitRequested());
    ASSERT_EQ(ui.boxes().size(), 2u);
    EXPECT_EQ(ui.boxes()[1].box.text, "could not create TVA SCPI Parser");
    EXPECT_EQ(ui.boxes()[1].box.caption, "");
    EXPECT_EQ(errorOf([&] { mute->readmodel(true); }),
              "could not create TVA SCPI Parser: the analyzer cannot be sent \"*IDN?\"");
    EXPECT_EQ(clock.totalWaited().count(), 0);
}

TEST_F(ProxyTest, HealthyConstructionAsksOnlyForTheParser) {
    auto proxy = connect();
    EXPECT_FALSE(proxy->quitRequested());
    EXPECT_THAT(ui.boxes(), IsEmpty());
    EXPECT_THAT(fake.log->calls, ElementsAre("app.scpiParser()"));
    // Nothing cached yet, nothing sent for cached reads.
    EXPECT_EQ(proxy->readportcount(false), 0);
    EXPECT_EQ(proxy->readmodel(false), "");
    EXPECT_THAT(proxy->readoptions(false), IsEmpty());
    EXPECT_THAT(fake.log->scpi(), IsEmpty());
    // Channel operations need preparecal.
    EXPECT_EQ(errorOf([&] { proxy->setcwfrequency(1e9); }), "m_pActiveChannel != NULL");
}

TEST_F(ProxyTest, ModelWithMillimetreWaveSubstitution) {
    auto proxy = connect();
    // A plain model asks only *IDN?, and the cache answers later reads.
    EXPECT_EQ(proxy->readmodel(true), "T3872A");
    EXPECT_EQ(proxy->readmodel(false), "T3872A");
    EXPECT_FALSE(proxy->ismmwave());
    EXPECT_THAT(fake.log->scpi(), ElementsAre("*IDN?"));

    // A B model with one configuration: no active-configuration query.
    fake.log->clear();
    fake.parser->reply("*IDN?", {"Maker,T3872B,US1,A.1"});
    fake.parser->reply("SYST:CONF:MWAV:CONF:CAT?", {"\"Default\""});
    EXPECT_EQ(proxy->readmodel(true), "T3872B");
    EXPECT_FALSE(proxy->ismmwave());
    EXPECT_THAT(fake.log->scpi(), ElementsAre("*IDN?", "SYST:CONF:MWAV:CONF:CAT?"));

    // Two configurations, broadband active.
    fake.log->clear();
    fake.parser->reply("SYST:CONF:MWAV:CONF:CAT?", {"\"Default,Broadband T3951A\""});
    fake.parser->reply("SYST:CONF:MWAV:CONF:ACT?",
                       {"\"Broadband T3951A\"", "\"Broadband T3950A\"", "\"Default\""});
    EXPECT_EQ(proxy->readmodel(true), "T3951A");
    EXPECT_TRUE(proxy->ismmwave());
    EXPECT_EQ(proxy->identificationmodel(), "T3872B");
    EXPECT_THAT(fake.log->scpi(),
                ElementsAre("*IDN?", "SYST:CONF:MWAV:CONF:CAT?", "SYST:CONF:MWAV:CONF:ACT?"));
    EXPECT_EQ(proxy->readmodel(true), "T3950A");
    EXPECT_TRUE(proxy->ismmwave());
    EXPECT_EQ(proxy->readmodel(true), "T3872B");
    EXPECT_FALSE(proxy->ismmwave());

    // Neither a non-B model nor a model not starting with T3 triggers the queries.
    for (const char* idn : {"Maker,T3871B,US1,A.1", "Maker,XT3872B,US1,A.1"}) {
        fake.log->clear();
        fake.parser->reply("*IDN?", {idn});
        proxy->readmodel(true);
        EXPECT_THAT(fake.log->scpi(), ElementsAre("*IDN?")) << idn;
    }
}

TEST_F(ProxyTest, MalformedIdentificationIsReportedWithTheReply) {
    auto proxy = connect();
    fake.parser->reply("*IDN?", {"Maker T3872A"});
    EXPECT_EQ(errorOf([&] { proxy->readmodel(true); }),
              "CNetworkAnalyzer::readmodel cannot find the model field in the *IDN? reply "
              "\"Maker T3872A\" (maker, model, serial, firmware expected)");
    fake.parser->reply("*IDN?", {"Maker,T3872A"});
    EXPECT_THAT(errorOf([&] { proxy->readmodel(true); }), HasSubstr("\"Maker,T3872A\""));
}

TEST_F(ProxyTest, OptionsSplitAndBaseModelCodes) {
    auto proxy = connect();
    proxy->readmodel(true);
    EXPECT_THAT(proxy->readoptions(true), ElementsAre("010", "080"));
    fake.parser->reply("*opt?", {"\"\"", "\"010,\""});
    EXPECT_THAT(proxy->readoptions(true), ElementsAre("No Options"));
    EXPECT_THAT(proxy->readoptions(true), ElementsAre("010", "No Options"));
    EXPECT_THAT(proxy->readoptions(false), ElementsAre("010", "No Options"));

    // Millimetre-wave systems get the code of their base model.
    fake.parser->reply("SYST:CONF:MWAV:CONF:CAT?", {"\"Default,Broadband\""});
    fake.parser->reply("SYST:CONF:MWAV:CONF:ACT?", {"\"Broadband\""});
    struct Case {
        const char* model;
        const char* options;
        std::vector<std::string> read;
    };
    for (const Case& c :
         {Case{"T3872B", "\"010,080,029\"", {"010", "080", "029", "402"}},
          Case{"T3872B", "\"010\"", {"010", "401"}}, Case{"T3877B", "\"010\"", {"010", "403"}},
          Case{"T3467B", "\"010\"", {"010", "202"}}, Case{"T3462B", "\"010\"", {"010", "201"}}}) {
        fake.parser->reply("*IDN?", {std::string("Maker,") + c.model + ",1,2"});
        fake.parser->reply("*opt?", {c.options});
        ASSERT_EQ(proxy->readmodel(true), "T3951A");
        EXPECT_EQ(proxy->readoptions(true), c.read) << c.model << " " << c.options;
    }

    fake.parser->reply("*IDN?", {"Maker,T3112B,1,2"});
    proxy->readmodel(true);
    EXPECT_EQ(errorOf([&] { proxy->readoptions(true); }),
              "CNetworkAnalyzer::readoptions T3112Bis not a recognized base TVA model for T3951A");
}

TEST_F(ProxyTest, MalformedOptionReplyIsReportedWithTheReply) {
    auto proxy = connect();
    for (const char* reply : {"010,080", "\"010,080"}) {
        fake.parser->reply("*opt?", {reply});
        EXPECT_EQ(errorOf([&] { proxy->readoptions(true); }),
                  std::string("CNetworkAnalyzer::readoptions cannot find the quoted option list "
                              "in the *opt? reply \"") +
                      reply + "\"");
    }
}

TEST_F(ProxyTest, PortCountAndHardwareUpdate) {
    auto proxy = connect();
    EXPECT_EQ(proxy->readportcount(true), 4);
    fake.parser->reply("diag:portcount?", {"two"});
    EXPECT_EQ(proxy->readportcount(false), 4);
    EXPECT_EQ(proxy->readportcount(true), 0);
    proxy->eeupdatehw();
    EXPECT_THAT(fake.log->scpi(),
                ElementsAre("diag:portcount?", "diag:portcount?", "diag:eeupdatehw"));
}
