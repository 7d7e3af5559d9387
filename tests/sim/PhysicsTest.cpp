#include <gtest/gtest.h>

#include <cmath>

#include "SimFixture.h"
#include "sim/Instrument.h"
#include "sim/ReceiverPhysics.h"

namespace {

using simtest::SimFixture;

TEST(ReceiverPhysics, PsatFollowsSlopeAndRippleAndTheClosedFormInvertsAtEveryFrequency) {
    sim::ReceiverParameters flat{.psatDbm = -7.0};
    sim::ReceiverParameters tilted{.psatDbm = -7.0,
                                   .psatSlopeDbPerGhz = -0.4,
                                   .psatRippleDb = 1.5,
                                   .psatRipplePeriodGhz = 4.0};
    // A quarter period is the ripple's crest, three quarters its trough, a half its zero.
    EXPECT_NEAR(-7.0, sim::psatDbm(tilted, 0.0), 1e-12);
    EXPECT_NEAR(-7.0 - 0.4 + 1.5, sim::psatDbm(tilted, 1e9), 1e-12);
    EXPECT_NEAR(-7.0 - 0.8, sim::psatDbm(tilted, 2e9), 1e-12);
    EXPECT_NEAR(-7.0 - 1.2 - 1.5, sim::psatDbm(tilted, 3e9), 1e-12);
    // 26.5 GHz is 6 5/8 periods: the ripple reads sin(225 degrees).
    EXPECT_NEAR(-7.0 - 10.6 - 1.5 * std::sqrt(0.5), sim::psatDbm(tilted, 26.5e9), 1e-12);
    // Without a ripple the period does not matter, even 0.
    sim::ReceiverParameters noPeriod{
        .psatDbm = -7.0, .psatSlopeDbPerGhz = 0.1, .psatRipplePeriodGhz = 0.0};
    EXPECT_NEAR(-7.0 + 1.3, sim::psatDbm(noPeriod, 13e9), 1e-12);
    EXPECT_DOUBLE_EQ(-7.0, sim::psatDbm(flat, 40e9));

    for (double s : {0.5, 1.0, 2.0, 4.0}) {
        tilted.smoothness = s;
        for (double f : {10e6, 1e9, 3e9, 7.7e9, 26.5e9, 110e9}) {
            const double psat = sim::psatDbm(tilted, f);
            for (double x : {0.05, 0.1, 0.2, 0.5, 1.0}) {
                double p = sim::compressionInputPowerDbm(tilted, x, f);
                EXPECT_NEAR(-x, sim::compressionDb(tilted, p, f), 1e-9)
                    << "s=" << s << " x=" << x << " f=" << f;
            }
            // At saturation the compression is (10/s) log10(2), and far below it nothing.
            EXPECT_NEAR(-10.0 / s * std::log10(2.0), sim::compressionDb(tilted, psat, f), 1e-12);
            EXPECT_GT(sim::compressionDb(tilted, psat - 150.0, f), -1e-6);
            EXPECT_NEAR(3.0 * sim::compressionDb(tilted, psat + 4.0, f),
                        sim::compressionPhaseDeg(tilted, psat + 4.0, f), 1e-12);
        }
    }
}

class Physics : public SimFixture {
  protected:
    // A power sweep of `points` points from start to stop dBm at 1 GHz, measuring `parameter`.
    std::vector<float> powerSweep(const std::string& parameter, double start, double stop,
                                  long points) {
        scpi("CALC:PAR:DEL:ALL");
        scpi("CALC:PAR:DEF:EXT \"m\",\"" + parameter + "\"");
        auto ch = channel();
        ch->setSweepType(2);
        ch->setCwFrequency(1e9);
        ch->setStartPower(start);
        ch->setStopPower(stop);
        ch->setNumberOfPoints(points);
        ch->singleSweep();
        EXPECT_EQ("0,\"No error\"", nextError());
        return read("m");
    }
    // CW sweeps of the given measurements ("name", "parameter") at the port's source power.
    std::shared_ptr<automation::Channel> cw(
        std::initializer_list<std::pair<const char*, const char*>> measurements, int port,
        double dbm) {
        scpi("CALC:PAR:DEL:ALL");
        for (const auto& [name, parameter] : measurements) {
            scpi(std::string("CALC:PAR:DEF:EXT \"") + name + "\",\"" + parameter + "\"");
        }
        auto ch = channel();
        ch->setSweepType(3);
        scpi("SOUR:POW " + std::to_string(dbm) + ",\"PORT " + std::to_string(port) + "\"");
        return ch;
    }
};

// A receiver whose Psat changes by several dB per GHz reads, at every point of every sweep
// type, the compression of that point's frequency.
TEST_F(Physics, EverySweepTypeReadsEachPointAtItsOwnFrequency) {
    start(R"({"receivers": {"A": {"psat_dbm": -14.0, "psat_slope_db_per_ghz": 2.0,
                                  "psat_ripple_db": 3.0, "psat_ripple_period_ghz": 3.0}}})");
    const auto& a = m_analyzer->scenario().receiver("A");
    scpi("CALC:PAR:DEL:ALL");
    scpi("CALC:PAR:DEF:EXT \"m\",\"A,1\"");
    scpi("SOUR:POW -10,\"PORT 1\"");
    auto ch = channel();
    auto expectReadings = [&](const std::string& sweep, const std::vector<double>& frequencies,
                              const std::vector<double>& powers) {
        ch->singleSweep();
        auto trace = read("m");
        ASSERT_EQ(frequencies.size(), trace.size()) << sweep;
        for (std::size_t i = 0; i < trace.size(); ++i) {
            EXPECT_NEAR(powers[i] + sim::compressionDb(a, powers[i], frequencies[i]), trace[i],
                        1e-4)
                << sweep << " point " << i;
        }
    };

    ch->setSweepType(0);
    ch->setNumberOfPoints(5);
    const double start = ch->startFrequency();
    const double step = (ch->stopFrequency() - start) / 4.0;
    expectReadings("linear",
                   {start, start + step, start + 2 * step, start + 3 * step, start + 4 * step},
                   std::vector<double>(5, -10.0));
    ch->setNumberOfPoints(1);
    expectReadings("linear, one point", {start}, {-10.0});

    ch->setSweepType(3);
    ch->setCwFrequency(7.3e9);
    ch->setNumberOfPoints(3);
    expectReadings("CW", {7.3e9, 7.3e9, 7.3e9}, {-10.0, -10.0, -10.0});

    ch->setSweepType(2);
    ch->setStartPower(-20.0);
    ch->setStopPower(0.0);
    expectReadings("power", {7.3e9, 7.3e9, 7.3e9}, {-20.0, -10.0, 0.0});

    auto table = automation::queryInterface<automation::SegmentTable>(ch->segmentTable());
    ASSERT_TRUE(table);
    table->writeTable({{1, 3, 1e9, 2e9, 1000, 0, 0},
                       {0, 4, 5e9, 6e9, 1000, 0, 0},
                       {1, 1, 9e9, 9.5e9, 1000, 0, 0},
                       {1, 2, 12e9, 12.6e9, 1000, 0, 0}});
    ch->setSweepType(4);
    expectReadings("segment", {1e9, 1.5e9, 2e9, 9e9, 12e9, 12.6e9}, std::vector<double>(6, -10.0));
}

// Every point of every receiver's power sweep sits on its own closed-form curve.
TEST_F(Physics, PowerSweepFollowsEachReceiversOwnCompressionCurve) {
    start(R"({"receivers": {"B": {"psat_dbm": 4.0, "smoothness": 2.0},
                            "R3": {"psat_dbm": -15.0, "smoothness": 0.7}}})");
    for (const auto& receiver : m_analyzer->scenario().receiverNames()) {
        const auto& physics = m_analyzer->scenario().receiver(receiver);
        auto trace = powerSweep(receiver + ",1", -60.0, 15.0, 76);
        ASSERT_EQ(76u, trace.size());
        for (std::size_t i = 0; i < trace.size(); i += 5) {
            double pin = -60.0 + static_cast<double>(i);
            EXPECT_NEAR(pin + sim::compressionDb(physics, pin, 1e9), trace[i], 1e-4)
                << receiver << " at " << pin;
        }
    }
}

TEST_F(Physics, RatioReadsPadPlusCompressionAndItsPhaseFollowsAmPm) {
    start();
    m_analyzer->instrument().cableReceivers({{"R1", 1, 20.0}});
    auto mag = powerSweep("R1/A,1", -40.0, 10.0, 51);
    auto phase = read("m", 2);
    const auto& r1 = m_analyzer->scenario().receiver("R1");
    for (std::size_t i = 0; i < mag.size(); i += 10) {
        double input = -40.0 + static_cast<double>(i) - 20.0;
        EXPECT_NEAR(20.0 + sim::compressionDb(r1, input, 1e9), mag[i], 1e-4);
        EXPECT_NEAR(r1.amPmDegPerDb * sim::compressionDb(r1, input, 1e9), phase[i], 1e-4);
    }
}

TEST_F(Physics, MemoryDivisionLeavesCompressionRelativeToTheReference) {
    start();
    auto ch = cw({{"measmag", "A,1"}, {"measratio", "A/R1,1"}}, 1, -25.0);
    ch->setNumberOfPoints(5);
    ch->singleSweep();
    scpi("CALC:PAR:SEL \"measratio\"");
    scpi("CALC:math:mem");
    scpi("CALC:math:func div");
    EXPECT_EQ("0,\"No error\"", nextError());
    scpi("SOUR:POW -5,\"PORT 1\"");
    ch->singleSweep();
    const auto& a = m_analyzer->scenario().receiver("A");
    double expected = sim::compressionDb(a, -5.0, 1e9) - sim::compressionDb(a, -25.0, 1e9);
    EXPECT_NEAR(expected, read("measratio")[4], 1e-5);
    // measmag is not divided: it reads the input power plus compression.
    EXPECT_NEAR(-5.0 + sim::compressionDb(a, -5.0, 1e9), read("measmag")[0], 1e-5);
    // Back to normal display: the ratio reads pad (0) plus compression again.
    scpi("CALC:math:func NORM");
    EXPECT_NEAR(sim::compressionDb(a, -5.0, 1e9), read("measratio")[0], 1e-5);
}

// Per-segment powers and point counts are checked through the proxy in ProxyAgainstSimTest.
TEST_F(Physics, SegmentSweepWithoutPerSegmentPowerUsesThePortPower) {
    start();
    auto ch = cw({{"measmag", "C,3"}}, 3, -12.0);
    auto table = automation::queryInterface<automation::SegmentTable>(ch->segmentTable());
    ASSERT_TRUE(table);
    table->writeTable({{1, 2, 1e9, 2e9, 1000, 0, -20}, {1, 3, 3e9, 4e9, 1000, 0, -2}});
    ch->setSweepType(4);
    EXPECT_DOUBLE_EQ(1e9, ch->startFrequency());
    EXPECT_DOUBLE_EQ(4e9, ch->stopFrequency());
    ch->singleSweep();
    const auto& c = m_analyzer->scenario().receiver("C");
    EXPECT_NEAR(-12.0 + sim::compressionDb(c, -12.0, 4e9), read("measmag")[4], 1e-5);
    EXPECT_THROW(table->writeTable({{1, 0, 1e9, 2e9, 1000, 0, 0}}), std::string);
    EXPECT_THROW(table->writeTable({{1, 5, 3e9, 2e9, 1000, 0, 0}}), std::string);
}

TEST_F(Physics, NarrowbandPathReadsThreeDbBelowWideband) {
    start();
    auto ch = cw({{"measmag", "R2,2"}}, 2, -10.0);
    ch->singleSweep();
    float wide = read("measmag")[0];
    scpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"NBF\"");
    ch->singleSweep();
    EXPECT_NEAR(-3.0, read("measmag")[0] - wide, 1e-5);
    scpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"WBF\"");
    ch->singleSweep();
    EXPECT_FLOAT_EQ(wide, read("measmag")[0]);
}

TEST_F(Physics, NoiseIsAveragedDownAndMeanStatisticReadsTheTrace) {
    start(R"({"receivers": {"*": {"noise_db": 0.2}}})");
    auto ch = cw({{"measratio", "A/R1,1"}}, 1, -40.0);
    ch->setNumberOfPoints(2000);
    auto spread = [&] {
        auto trace = read("measratio");
        double sum = 0.0;
        for (float v : trace) {
            sum += v * v;
        }
        return std::sqrt(sum / static_cast<double>(trace.size()));
    };
    ch->singleSweep();
    double single = spread();
    EXPECT_NEAR(0.2, single, 0.02);
    scpi("SENS:AVER:STAT ON");
    scpi("SENS:AVER:COUN 16");
    for (int i = 0; i < 16; ++i) {
        ch->singleSweep();
    }
    EXPECT_NEAR(0.05, spread(), 0.01);  // 0.2 / sqrt(16)
    scpi("format:data ASC");
    scpi("calculate:function:type MEAN");
    double mean = std::atof(scpi("calculate:function:data?").c_str());
    EXPECT_NEAR(0.0, mean, 0.005);
}

TEST_F(Physics, UnconnectedReceiverReadsTheNoiseFloorWhateverTheSource) {
    start();
    m_analyzer->instrument().cableReceivers({{"A", 1, 0.0}});
    cw({{"measmag", "A,2"}}, 2, 0.0)->singleSweep();  // port 2 is not cabled to A
    EXPECT_FLOAT_EQ(static_cast<float>(sim::Instrument::noiseFloorDbm), read("measmag")[0]);
}

TEST_F(Physics, TraceReadsReportFailuresAsStatus) {
    start();
    auto m = automation::queryInterface<automation::MeasurementData>(m_app->currentMeasurement());
    ASSERT_TRUE(m);
    std::vector<float> buffer(201);
    long points = 201;
    EXPECT_NE(0, m->readData(2, 1, points, buffer));  // nothing swept yet
    EXPECT_EQ(0, points);
    channel()->singleSweep();
    points = 201;
    EXPECT_NE(0, m->readData(1, 1, points, buffer));   // wrong location
    EXPECT_NE(0, m->readData(2, 99, points, buffer));  // unknown format
    points = 201;
    EXPECT_EQ(0, m->readData(2, 0, points, buffer));
    EXPECT_EQ(201, points);
    EXPECT_FLOAT_EQ(1.0f, buffer[0]);  // S11 of the preset reads 0 dB
    points = 500;
    std::vector<float> small(10);
    EXPECT_EQ(0, m->readData(2, 1, points, small));
    EXPECT_EQ(10, points);
}

}  // namespace
