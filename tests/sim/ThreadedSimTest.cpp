#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "SimFixture.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/SimulatedBench.h"

namespace {

// The worker sweeps and reads while the dialog's thread queries, the bench recables and a
// test reads the transcript: every access goes through the instrument's lock.
TEST(ThreadedSimulatedAnalyzer, ConcurrentUsersSeeConsistentState) {
    testsupport::TempDir state;
    sim::SimulatedAnalyzer analyzer(sim::Scenario{}, state.path());
    platform::ScriptedOperatorUi ui;
    ui.answerAll(platform::Answer::Ok);
    sim::SimulatedBench bench(ui, analyzer);
    std::atomic<bool> failed{false};
    auto parserOf = [](const std::shared_ptr<automation::Application>& app) {
        return automation::queryInterface<automation::ScpiParser>(app->scpiParser());
    };

    std::thread worker([&] {
        auto app = automation::queryInterface<automation::Application>(analyzer.application());
        auto parser = parserOf(app);
        auto channel = automation::queryInterface<automation::Channel>(app->activeChannel());
        parser->parse("CALC:PAR:DEL:ALL");
        parser->parse("CALC:PAR:DEF:EXT \"measratio\",\"A/R1,1\"");
        auto data =
            automation::queryInterface<automation::MeasurementData>(app->currentMeasurement());
        std::vector<float> buffer(201);
        for (int i = 0; i < 200; ++i) {
            channel->setContinuousSweep(true);
            long points = 201;
            if (data->readData(2, 1, points, buffer) != 0 || points != 201) {
                failed = true;
            }
        }
    });
    std::thread dialog([&] {
        auto parser =
            parserOf(automation::queryInterface<automation::Application>(analyzer.application()));
        for (int i = 0; i < 200; ++i) {
            if (parser->parse("diag:portcount?") != "4") {
                failed = true;
            }
            parser->parse("DIAG:FLASHARRAY \"RcvrChar\",\"B\", 1, 2, " + std::to_string(i));
        }
    });
    std::thread operatorHands([&] {
        for (int i = 0; i < 100; ++i) {
            bench.messageBox({"Connect cable from PORT 1 to \"RCVR A IN\" (with no pad).",
                              "Connections", platform::Buttons::Ok, platform::BoxNone});
            analyzer.transcript();
        }
    });
    worker.join();
    dialog.join();
    operatorHands.join();
    EXPECT_FALSE(failed);
    auto parser =
        parserOf(automation::queryInterface<automation::Application>(analyzer.application()));
    EXPECT_EQ(",1,2,199", parser->parse("DIAG:flasharray? \"RCVRCHAR\",\"B\""));
    EXPECT_EQ("0,\"No error\"", parser->parse("SYST:ERR?"));
}

}  // namespace
