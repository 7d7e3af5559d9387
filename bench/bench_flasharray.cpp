// Rendering "DIAG:FLASHARRAY" for a characterization of 100,000 frequency records,
// against copying the same finished text.

#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "analyzer/NetworkAnalyzerClass.h"
#include "analyzer/automation/BackendFactory.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"

namespace {

constexpr std::size_t records = 100000;
constexpr std::size_t imageWords = 11 + 28 * records;

// Takes each command and keeps only the length of the longest.
class SinkParser : public automation::ScpiParser {
  public:
    std::string parse(const std::string& command) override {
        longest = std::max(longest, command.size());
        benchmark::DoNotOptimize(command.data());
        return "";
    }
    std::size_t longest = 0;
};

class SinkApplication : public automation::Application {
  public:
    std::shared_ptr<automation::Object> scpiParser() override { return parser; }
    void reset() override {}
    void preset(int) override {}
    std::shared_ptr<automation::Object> activeChannel() override { return nullptr; }
    std::shared_ptr<automation::Object> currentMeasurement() override { return nullptr; }
    std::shared_ptr<automation::Object> measurements() override { return nullptr; }
    void setTriggerSetting(int) override {}
    void wait(int, int) override {}
    std::shared_ptr<SinkParser> parser = std::make_shared<SinkParser>();
};

class SilentUi : public platform::OperatorUi {
  public:
    platform::Answer messageBox(const platform::MessageBox&) override {
        return platform::Answer::Ok;
    }
    platform::BadDataChoice badDataChoice(const std::string&) override {
        return platform::BadDataChoice::Continue;
    }
};

// Words spread over the whole 16-bit range, as packed floats are.
std::vector<std::uint16_t> sampleImage() {
    std::vector<std::uint16_t> image(imageWords);
    std::uint32_t state = 12345;
    for (auto& word : image) {
        state = state * 1664525u + 1013904223u;
        word = static_cast<std::uint16_t>(state >> 16);
    }
    return image;
}

void BM_FlashArrayRender(benchmark::State& state) {
    auto application = std::make_shared<SinkApplication>();
    automation::BackendFactory::registerBackend(
        "bench", [application](const std::string&) { return application; });
    SilentUi ui;
    platform::VirtualClock clock;
    CNetworkAnalyzer proxy("bench", ui, clock);
    const auto image = sampleImage();
    for (auto _ : state) {
        benchmark::DoNotOptimize(proxy.flasharray("RcvrChar", "A", image));
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(application->parser->longest));
    state.counters["chars"] = static_cast<double>(application->parser->longest);
    automation::BackendFactory::unregisterBackend("bench");
}
BENCHMARK(BM_FlashArrayRender)->Unit(benchmark::kMillisecond);

void BM_MemcpyOfSameText(benchmark::State& state) {
    const auto image = sampleImage();
    std::string text = "DIAG:FLASHARRAY \"RcvrChar\",\"A\"";
    for (auto word : image) {
        text += ", " + std::to_string(word);
    }
    std::vector<char> destination(text.size());
    for (auto _ : state) {
        std::memcpy(destination.data(), text.data(), text.size());
        benchmark::DoNotOptimize(destination.data());
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(text.size()));
    state.counters["chars"] = static_cast<double>(text.size());
}
BENCHMARK(BM_MemcpyOfSameText)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
