// One segment sweep of 10,000 points on the simulated analyzer and the reads of its traces,
// and the parse of a flash array write of 100,000 records.

#include <benchmark/benchmark.h>

#include <filesystem>
#include <random>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"
#include "sim/SimulatedAnalyzer.h"

namespace {

using automation::queryInterface;

struct SimBench {
    std::filesystem::path state;
    std::unique_ptr<sim::SimulatedAnalyzer> analyzer;
    std::shared_ptr<automation::Application> app;
    std::shared_ptr<automation::ScpiParser> parser;
    std::shared_ptr<automation::Channel> channel;

    SimBench() {
        state = std::filesystem::temp_directory_path() /
                ("rcvrchar-bench-" + std::to_string(std::random_device{}()));
        analyzer = std::make_unique<sim::SimulatedAnalyzer>(sim::Scenario{}, state);
        app = queryInterface<automation::Application>(analyzer->application());
        parser = queryInterface<automation::ScpiParser>(app->scpiParser());
        channel = queryInterface<automation::Channel>(app->activeChannel());
    }
    ~SimBench() {
        analyzer.reset();
        std::error_code ec;
        std::filesystem::remove_all(state, ec);
    }
};

void SegmentSweepOf10000PointsAndTraceReads(benchmark::State& state) {
    SimBench b;
    b.parser->parse("CALC:PAR:DEL:ALL");
    b.parser->parse("CALC:PAR:DEF:EXT \"measmag\",\"A,1\"");
    b.parser->parse("CALC:PAR:DEF:EXT \"measratio\",\"A/R1,1\"");
    std::vector<automation::SegmentRow> rows;
    for (int s = 0; s < 10; ++s) {
        rows.push_back({1, 1000, 1e9 * (s + 1), 1e9 * (s + 1.9), 1000, 0, -30.0 + 3 * s});
    }
    auto table = queryInterface<automation::SegmentTable>(b.channel->segmentTable());
    table->writeTable(rows);
    table->enablePerSegmentPower();
    b.channel->setSweepType(4);
    auto collection = queryInterface<automation::MeasurementCollection>(b.app->measurements());
    auto magnitude = queryInterface<automation::MeasurementData>(collection->item(1));
    auto ratio = queryInterface<automation::MeasurementData>(collection->item(2));
    std::vector<float> buffer(10000);
    for (auto _ : state) {
        b.channel->setContinuousSweep(true);
        long points = 10000;
        magnitude->readData(2, 1, points, buffer);
        ratio->readData(2, 1, points, buffer);
        ratio->readData(2, 2, points, buffer);
        benchmark::DoNotOptimize(buffer.data());
    }
    state.SetItemsProcessed(state.iterations() * 10000);
}
BENCHMARK(SegmentSweepOf10000PointsAndTraceReads)->Unit(benchmark::kMillisecond);

void FlashArrayWriteOf100000Records(benchmark::State& state) {
    SimBench b;
    std::string command = "DIAG:FLASHARRAY \"RcvrChar\",\"A\"";
    const std::size_t words = 11 + 28 * 100000;
    for (std::size_t i = 0; i < words; ++i) {
        command += ", " + std::to_string((i * 7919) % 65536);
    }
    for (auto _ : state) {
        benchmark::DoNotOptimize(b.parser->parse(command));
    }
    state.SetBytesProcessed(static_cast<long>(state.iterations() * command.size()));
}
BENCHMARK(FlashArrayWriteOf100000Records)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
