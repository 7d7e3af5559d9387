// The SCPI codec on a 100,001-point complex trace (ASCII and REAL,64, written and read
// back) and the framing of a 100 MB stream arriving in 4 KiB pieces.

#include <benchmark/benchmark.h>

#include <cmath>
#include <string>
#include <vector>

#include "scpi/MessageFramer.h"
#include "scpi/NumberFormat.h"

namespace {

std::vector<double> complexTrace() {
    std::vector<double> values(2 * 100001);
    for (std::size_t i = 0; i < values.size(); ++i) {
        values[i] = std::sin(0.001 * static_cast<double>(i)) * 1e-3;
    }
    return values;
}

void TraceWrite(benchmark::State& state, scpi::DataFormat format) {
    const auto values = complexTrace();
    std::string out;
    for (auto _ : state) {
        out.clear();
        scpi::appendValues(out, values, format, scpi::ByteOrder::Normal);
        benchmark::DoNotOptimize(out.data());
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * out.size()));
}

void TraceRead(benchmark::State& state, scpi::DataFormat format) {
    std::string response;
    scpi::appendValues(response, complexTrace(), format, scpi::ByteOrder::Normal);
    for (auto _ : state) {
        benchmark::DoNotOptimize(scpi::decodeValues(response, format, scpi::ByteOrder::Normal));
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * response.size()));
}

void FramingOf100MBIn4KiBPieces(benchmark::State& state) {
    std::string stream;
    while (stream.size() < (100u << 20)) {
        stream += "CALC:DATA #18abcdefgh;'text\n';*OPC?\n";
    }
    for (auto _ : state) {
        scpi::MessageFramer framer;
        for (std::size_t at = 0; at < stream.size(); at += 4096) {
            framer.feed(std::string_view(stream).substr(at, 4096));
            while (auto message = framer.next()) {
                benchmark::DoNotOptimize(message->data());
            }
        }
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * stream.size()));
}

BENCHMARK_CAPTURE(TraceWrite, Ascii, scpi::DataFormat::Ascii)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(TraceWrite, Real64, scpi::DataFormat::Real64)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(TraceRead, Ascii, scpi::DataFormat::Ascii)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(TraceRead, Real64, scpi::DataFormat::Real64)->Unit(benchmark::kMillisecond);
BENCHMARK(FramingOf100MBIn4KiBPieces)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
