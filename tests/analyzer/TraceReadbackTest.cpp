#include "ProxyFixture.h"

using ::testing::ElementsAre;

class TraceTest : public ProxyTest {
  protected:
    void SetUp() override {
        proxy = prepared();  // 21 points
        fake.collection->items = {measmag, measratio};
        proxy->refreshmeasurements();
        fake.log->clear();
    }
    std::shared_ptr<fakeanalyzer::FakeMeasurement> measmag =
        std::make_shared<fakeanalyzer::FakeMeasurement>(fake.log, "measmag", "A,PORT 1");
    std::shared_ptr<fakeanalyzer::FakeMeasurement> measratio =
        std::make_shared<fakeanalyzer::FakeMeasurement>(fake.log, "measratio", "A/R1,PORT 1");
    std::unique_ptr<CNetworkAnalyzer> proxy;
};

TEST_F(TraceTest, FormatsMapToTheirCodes) {
    std::vector<float> trace(21);
    EXPECT_EQ(proxy->readdata("measmag", "logmag", trace), 21);
    EXPECT_EQ(trace.front(), 1000.0f);
    EXPECT_EQ(trace.back(), 1020.0f);
    const std::pair<const char*, int> formats[] = {
        {"LINMAG", 0},    {"PHASE", 2},           {"Delay", 5},          {"REAL", 6},
        {"IMAGINARY", 7}, {"phase unwrapped", 9}, {"PHASE POSITIVE", 14}};
    for (const auto& [format, code] : formats) {
        proxy->readdata("measratio", format, trace);
        EXPECT_EQ(fake.log->calls.back(),
                  "measurement measratio.readData(2," + std::to_string(code) + ",21)")
            << format;
    }
    EXPECT_EQ(fake.log->calls.front(), "measurement measmag.readData(2,1,21)");
}

TEST_F(TraceTest, FailedReadsNameMeasurementAndFormat) {
    std::vector<float> trace(21);
    EXPECT_EQ(errorOf([&] { proxy->readdata("measmag", "dB", trace); }),
              "CNetworkAnalyzer::readdata DBIs not a recognized format");
    EXPECT_EQ(errorOf([&] { proxy->readdata("unknown", "polar", trace); }),
              "CNetworkAnalyzer::readdata POLARIs not a recognized format");
    EXPECT_EQ(errorOf([&] { proxy->readdata("measMag", "LOGMAG", trace); }),
              "CNetworkAnalyzer::readdata LOGMAG of measurement \"measMag\": no such measurement "
              "among the 2 last listed by the analyzer");
    measratio->status = -2147467259;
    EXPECT_EQ(errorOf([&] { proxy->readdata("measratio", "phase", trace); }),
              "CNetworkAnalyzer::readdata PHASE of measurement \"measratio\" failed with status "
              "-2147467259");
    std::vector<float> shortTrace(20);
    EXPECT_EQ(errorOf([&] { proxy->readdata("measmag", "LOGMAG", shortTrace); }),
              "CNetworkAnalyzer::readdata LOGMAG of measurement \"measmag\": the buffer holds 20 "
              "values, the channel has 21 points");
    // Only the status read reached the analyzer.
    EXPECT_THAT(fake.log->calls, ElementsAre("measurement measratio.readData(2,2,21)"));

    // The analyzer reports more points than the buffer took.
    measmag->deliveredPoints = 30;
    EXPECT_EQ(errorOf([&] { proxy->readdata("measmag", "LOGMAG", trace); }),
              "CNetworkAnalyzer::readdata LOGMAG of measurement \"measmag\": the analyzer "
              "delivered 30 points, the buffer holds 21");
}

TEST_F(TraceTest, AnalyzerMayShortenTheTrace) {
    measmag->deliveredPoints = 11;
    std::vector<float> trace(21, -1.0f);
    EXPECT_EQ(proxy->readdata("measmag", "LOGMAG", trace), 11);
    EXPECT_EQ(trace[10], 1010.0f);
    EXPECT_EQ(trace[11], -1.0f);
    EXPECT_EQ(proxy->readnumberofpoints(false), 11);
}

TEST_F(TraceTest, TablesAreRebuiltAndEmptied) {
    auto redefined = std::make_shared<fakeanalyzer::FakeMeasurement>(fake.log, "measmag", "B");
    fake.collection->items = {redefined};
    proxy->refreshmeasurements();
    std::vector<float> trace(21);
    proxy->readdata("measmag", "LOGMAG", trace);
    EXPECT_EQ(fake.log->calls.back(), "measurement measmag.readData(2,1,21)");
    redefined->status = 5;  // proves the read went to the redefined object
    EXPECT_THAT(errorOf([&] { proxy->readdata("measmag", "LOGMAG", trace); }),
                ::testing::EndsWith("failed with status 5"));
    EXPECT_THAT(errorOf([&] { proxy->readdata("measratio", "LOGMAG", trace); }),
                ::testing::HasSubstr("no such measurement among the 1 last listed"));

    proxy->clearmeasurements();
    EXPECT_THAT(errorOf([&] { proxy->readdata("measmag", "LOGMAG", trace); }),
                ::testing::HasSubstr("no such measurement among the 0 last listed"));

    fake.collection->items = {std::make_shared<automation::Object>()};
    EXPECT_EQ(errorOf([&] { proxy->refreshmeasurements(); }),
              "CNetworkAnalyzer::refreshmeasurements: measurement 1 of 1 offers no measurement "
              "data");
}

TEST_F(TraceTest, CurrentMeasurementValue) {
    EXPECT_EQ(proxy->readcurrentvalue("LOGMAG"), 1000.0f);
    EXPECT_EQ(proxy->readcurrentvalue("PHASE"), 2000.0f);
    EXPECT_EQ(fake.log->calls.back(), "measurement CH1_S11_1.readData(2,2,21)");
    fake.current->status = 3;
    EXPECT_EQ(errorOf([&] { proxy->readcurrentvalue("logmag"); }),
              "CNetworkAnalyzer::readdata LOGMAG of measurement \"CH1_S11_1\" failed with "
              "status 3");
}
