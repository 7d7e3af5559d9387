#include <benchmark/benchmark.h>

#include <fstream>
#include <sstream>

#include "config/CSVExtra.h"
#include "config/T3872Acomcal.h"

namespace {

const std::string kSample = RCVRCHAR_SOURCE_DIR "/data/RcvrChar.dat";

// Loading the file alone: the CSV reader.
void BM_LoadSample(benchmark::State& state) {
    for (auto _ : state) {
        CCSVExtra csv;
        benchmark::DoNotOptimize(csv.Load(kSample, false));
        benchmark::DoNotOptimize(csv.RowCount());
    }
}
BENCHMARK(BM_LoadSample);

// The dialog's start-up read of the default analyzer's configuration.
void BM_ReadSequenceDefaultAnalyzer(benchmark::State& state) {
    for (auto _ : state) {
        CT3872Acomcal config;
        config.SetModel("T3872A");
        config.SetOptions({"010", "080"});
        config.ReadSequence(kSample);
        benchmark::DoNotOptimize(config.GetConstant("minband"));
    }
}
BENCHMARK(BM_ReadSequenceDefaultAnalyzer);

// The model read last in the file, so every table above it is scanned.
void BM_ReadSequenceLastModel(benchmark::State& state) {
    for (auto _ : state) {
        CT3872Acomcal config;
        config.SetModel("T3877A");
        config.SetOptions({"080"});
        config.ReadSequence(kSample);
        benchmark::DoNotOptimize(config.GetLFEBandDefaults(0));
    }
}
BENCHMARK(BM_ReadSequenceLastModel);

// A file grown to several thousand rows by repeating the sample's tables under other names.
void BM_ReadSequenceLargeFile(benchmark::State& state) {
    std::ifstream in(kSample, std::ios::binary);
    std::stringstream sample;
    sample << in.rdbuf();
    std::string body = sample.str().substr(sample.str().find('\n') + 1);
    std::string text = sample.str();
    for (int copy = 0; copy < state.range(0); ++copy) {
        std::string renamed = body;
        for (std::size_t at = renamed.find("T38"); at != std::string::npos;
             at = renamed.find("T38", at + 1)) {
            renamed[at + 1] = 'X';  // "TX8..." names no real model
        }
        text += renamed;
    }
    const std::string path = "bench_config_large.dat";
    std::ofstream(path, std::ios::binary) << text;
    for (auto _ : state) {
        CT3872Acomcal config;
        config.SetModel("T3872A");
        config.SetOptions({"010", "080"});
        config.ReadSequence(path);
        benchmark::DoNotOptimize(config.GetConstant("maxband"));
    }
    std::remove(path.c_str());
}
BENCHMARK(BM_ReadSequenceLargeFile)->Arg(10)->Arg(40);

}  // namespace

BENCHMARK_MAIN();
