#include <gtest/gtest.h>

#include "SentCommands.h"
#include "TempDir.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Clock.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/ReceiverPhysics.h"
#include "sim/SimulatedAnalyzer.h"

namespace {

// The real analyzer proxy, created through the back-end factory, driving the simulator.
class ProxyAgainstSim : public ::testing::Test {
  protected:
    void start(const std::string& scenario) {
        m_analyzer = std::make_unique<sim::SimulatedAnalyzer>(sim::Scenario::fromJson(scenario),
                                                              m_state.path());
        m_analyzer->registerAsBackend();
        m_proxy = std::make_unique<CNetworkAnalyzer>("", m_operator, m_clock);
        ASSERT_FALSE(m_proxy->quitRequested());
    }
    void TearDown() override {
        if (::testing::Test::HasFailure() && m_analyzer) {
            for (const auto& line : m_analyzer->transcript()) {
                std::cerr << line << '\n';
            }
        }
    }

    testsupport::TempDir m_state;
    platform::ScriptedOperatorUi m_operator;
    platform::VirtualClock m_clock;
    std::unique_ptr<sim::SimulatedAnalyzer> m_analyzer;
    std::unique_ptr<CNetworkAnalyzer> m_proxy;
};

TEST_F(ProxyAgainstSim, IdentifiesAndPreparesTheAnalyzer) {
    start(R"({"options": "010,080"})");
    EXPECT_EQ("T3872A", m_proxy->readmodel(true));
    EXPECT_FALSE(m_proxy->ismmwave());
    EXPECT_EQ((std::vector<std::string>{"010", "080"}), m_proxy->readoptions(true));
    EXPECT_EQ(4, m_proxy->readportcount(true));
    m_proxy->preparecal();
    EXPECT_EQ(21, m_proxy->readnumberofpoints(false));
    EXPECT_EQ("R1", m_proxy->readmeasurementname(true));
    EXPECT_DOUBLE_EQ(-30.0, m_proxy->readsourcepower(true));
    std::string errors;
    EXPECT_EQ(0, m_proxy->checkerrors(errors));
    EXPECT_EQ("", errors);
    EXPECT_TRUE(m_operator.boxes().empty());
}

TEST_F(ProxyAgainstSim, MillimetreWaveModelAndBaseOption) {
    start(R"({"idn": "Velquor Technologies,T3872B,MY2,A.13.55.06", "options": "010,080,029",
              "mmwave_catalog": "Default,T3951A Broadband", "mmwave_active": "T3951A Broadband"})");
    EXPECT_EQ("T3951A", m_proxy->readmodel(true));
    EXPECT_TRUE(m_proxy->ismmwave());
    EXPECT_EQ((std::vector<std::string>{"010", "080", "029", "402"}), m_proxy->readoptions(true));
}

TEST_F(ProxyAgainstSim, CheckErrorsDrainsTheQueue) {
    start(R"({"faults": {"scpi_errors": [{"command": "diag:fcal:load",
              "errors": ["-200,\"Execution error\""]}]}})");
    m_proxy->sendscpi("NO:SUCH:COMMAND");
    m_proxy->sendscpi("diag:fcal:load");
    std::string errors;
    EXPECT_EQ(-200, m_proxy->checkerrors(errors));
    EXPECT_EQ(",\"Undefined header\"\n,\"Execution error\"", errors);
    EXPECT_EQ(0, m_proxy->checkerrors(errors));
}

TEST_F(ProxyAgainstSim, SegmentSweepReadsCompressionThroughTheProxy) {
    start(R"({"receivers": {"A": {"psat_slope_db_per_ghz": -1.5}}})");
    m_proxy->preparecal();
    m_proxy->sendscpi("CALC:PAR:DEL:ALL");
    m_proxy->sendscpi("CALC:PAR:DEF:EXT \"measmag\",\"A,1\"");
    m_proxy->sendscpi("CALC:PAR:DEF:EXT \"measratio\",\"A/R1,1\"");
    m_proxy->setsegments({1e9, 3e9}, {2e9, 4e9}, {3, 5}, {1000, 1000}, {-25, -5}, 0, 0);
    EXPECT_EQ(8, m_proxy->readnumberofpoints(true));
    m_proxy->sweep(false);
    m_proxy->refreshmeasurements();
    std::vector<float> mag(8);
    std::vector<float> ratio(8);
    EXPECT_EQ(8, m_proxy->readdata("measmag", "logmag", mag));
    EXPECT_EQ(8, m_proxy->readdata("measratio", "LOGMAG", ratio));
    const auto& a = m_analyzer->scenario().receiver("A");
    EXPECT_NEAR(-25.0 + sim::compressionDb(a, -25.0, 1e9), mag[0], 1e-4);
    EXPECT_NEAR(-5.0 + sim::compressionDb(a, -5.0, 4e9), mag[7], 1e-4);
    EXPECT_NEAR(sim::compressionDb(a, -5.0, 4e9), ratio[7], 1e-4);
    EXPECT_THROW(m_proxy->readdata("measratio", "SMITH", ratio), std::string);
    std::string errors;
    EXPECT_EQ(0, m_proxy->checkerrors(errors)) << errors;
}

TEST_F(ProxyAgainstSim, FlashArrayAndCatalogRoundTrip) {
    start("{}");
    std::vector<std::uint16_t> image{1, 0, 0, 4, 65535};
    EXPECT_EQ("", m_proxy->flasharray("RcvrChar", "B", image));
    std::string catalog = m_proxy->flashcatalog();
    EXPECT_NE(std::string::npos, catalog.find(" RCVRCHAR\\B")) << catalog;
    std::string errors;
    EXPECT_EQ(0, m_proxy->checkerrors(errors)) << errors;
    EXPECT_EQ((std::vector<std::string>{"DIAG:FLASHARRAY \"RcvrChar\",\"B\", 1, 0, 0, 4, 65535",
                                        "DIAG:POKE 9,4", "DIAG:POKE 9,3", "DIAG:EEUPDATEHW",
                                        "DIAG:FLASH:CAT?"}),
              testsupport::sentCommands(*m_analyzer));
}

TEST_F(ProxyAgainstSim, ProxyBuiltAfterARestartWorksAndTheOldOneIsRefused) {
    start("{}");
    m_proxy->preparecal();
    m_analyzer->restartApplication();
    EXPECT_THROW(m_proxy->sendscpi("*IDN?"), std::string);
    m_proxy = std::make_unique<CNetworkAnalyzer>("", m_operator, m_clock);
    EXPECT_EQ("T3872A", m_proxy->readmodel(true));
    m_proxy->preparecal();
}

}  // namespace
