// The engine's data-sized steps at 100,000 frequencies x 61 power levels: the compression
// search over everything, building the image with its raw result file, and the raw CSV
// export compared with writing the same bytes from a ready buffer.

#include <benchmark/benchmark.h>

#include <cmath>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "engine/CompressionData.h"
#include "platform/ScriptedOperatorUi.h"
#include "storage/ResultProcessing.h"

namespace {

constexpr int kFrequencies = 100000;
constexpr int kLevels = 61;

// A store of healthy Rapp-like receivers whose saturation drifts with frequency.
struct Fixture {
    platform::ScriptedOperatorUi ui;
    engine::CCompressionData store{ui};
    std::filesystem::path dir = std::filesystem::temp_directory_path() / "rcvrchar-bench-engine";

    Fixture() {
        std::filesystem::create_directories(dir);
        store.setLimits({20.0, 2.0, 0.8f, 1e12, false, false});
        std::vector<double> frequencies(kFrequencies);
        for (int j = 0; j < kFrequencies; ++j) {
            frequencies[j] = 1e7 + 2.65e5 * j;
        }
        store.setFrequencies(std::move(frequencies), {});
        std::vector<double> ladder(kLevels);
        for (int i = 0; i < kLevels; ++i) {
            ladder[i] = -40.0 + 0.75 * i;
        }
        store.setPowerLevels(ladder);
        std::vector<float> test(kFrequencies), ratio(kFrequencies), phase(kFrequencies);
        for (int i = 0; i < kLevels; ++i) {
            for (int j = 0; j < kFrequencies; ++j) {
                const double psat = -5.0 + 3.0 * std::sin(j * 1e-4);
                const double c = -2.5 * std::log10(1 + std::pow(10, 0.4 * (ladder[i] - psat)));
                test[j] = static_cast<float>(ladder[i] + c);
                ratio[j] = static_cast<float>(c);
                phase[j] = static_cast<float>(3 * c);
            }
            store.putTrace("TestMag", test, i);
            store.putTrace("RatioMag", ratio, i);
            store.putTrace("Phase", phase, i);
        }
    }
    ~Fixture() { std::filesystem::remove_all(dir); }
};

Fixture& fixture() {
    static Fixture instance;
    return instance;
}

void BM_FindCompressionPointAll(benchmark::State& state) {
    auto& store = fixture().store;
    const float levels[4] = {0.05f, 0.1f, 0.2f, 0.5f};
    const float tolerances[4] = {0.006f, 0.008f, 0.01f, 0.01f};
    for (auto _ : state) {
        int reached = 0;
        for (int f = 0; f < kFrequencies; ++f) {
            int start = -1;
            bool stop = false;
            for (int k = 0; k < 4 && !stop; ++k) {
                if (k > 0) {
                    ++start;
                }
                reached +=
                    store.findCompressionPoint(levels[k], tolerances[k], f, k == 0, start, stop);
            }
        }
        benchmark::DoNotOptimize(reached);
    }
}
BENCHMARK(BM_FindCompressionPointAll)->Unit(benchmark::kMillisecond);

void BM_BuildImage(benchmark::State& state) {
    auto& data = fixture();
    const auto raw = data.dir / "rcvrCharRaw_A.txt";
    for (auto _ : state) {
        auto judgement = storage::judgeResults(data.store, "A", false, raw, data.ui);
        benchmark::DoNotOptimize(judgement.image.wordCount());
    }
}
BENCHMARK(BM_BuildImage)->Unit(benchmark::kMillisecond);

void BM_WriteAllMeasuredData(benchmark::State& state) {
    auto& data = fixture();
    for (auto _ : state) {
        data.store.writeAllMeasuredData("A", data.dir);
    }
    state.SetBytesProcessed(state.iterations() * std::filesystem::file_size(
                                                     data.dir / "RcvrChar_AllMeasuredData_A.csv"));
}
// Wall time: the export formats on other threads while it writes.
BENCHMARK(BM_WriteAllMeasuredData)->Unit(benchmark::kMillisecond)->UseRealTime();

// The floor for the export: the same bytes, already formatted, written in the same blocks.
void BM_WriteReadyBuffer(benchmark::State& state) {
    auto& data = fixture();
    data.store.writeAllMeasuredData("A", data.dir);
    std::ifstream in(data.dir / "RcvrChar_AllMeasuredData_A.csv", std::ios::binary);
    std::stringstream buffer;
    buffer << in.rdbuf();
    const std::string bytes = buffer.str();
    const auto target = data.dir / "ready.csv";
    for (auto _ : state) {
        std::FILE* file = std::fopen(target.c_str(), "wb");
        for (std::size_t at = 0; at < bytes.size(); at += 1 << 20) {
            std::fwrite(bytes.data() + at, 1, std::min<std::size_t>(1 << 20, bytes.size() - at),
                        file);
        }
        std::fclose(file);
    }
    state.SetBytesProcessed(state.iterations() * bytes.size());
}
BENCHMARK(BM_WriteReadyBuffer)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

BENCHMARK_MAIN();
