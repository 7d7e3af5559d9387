#include <algorithm>
#include <deque>
#include <future>
#include <vector>

#include "engine/CompressionData.h"
#include "platform/NumberText.h"
#include "platform/WholeFile.h"

namespace engine {

std::string CCompressionData::measuredDataFileName(const std::string& tag) {
    return "RcvrChar_AllMeasuredData_" + tag + ".csv";
}

namespace {

// One row of a table as the export reads it: a short row repeats its last reading, a missing
// or empty row reads as 0.
struct RowReadings {
    const float* values = nullptr;
    std::size_t size = 0;

    float at(std::size_t column) const {
        if (column < size) {
            return values[column];
        }
        return size == 0 ? 0.0f : values[size - 1];
    }
};

RowReadings rowOf(const CCompressionData::Table& table, std::size_t row) {
    if (row >= table.size()) {
        return {};
    }
    return {table[row].data(), table[row].size()};
}

constexpr std::size_t kTileWidth = 64;
constexpr std::size_t kChunkRoom = std::size_t{4} << 20;
constexpr std::size_t kChunksInFlight = 2;

// Bytes one line can take at the most.
std::size_t lineRoom(const std::vector<RowReadings>& readings) {
    return (readings.size() + 1) * (platform::kNumberRoom + 1) + 1;
}

struct LinesText {
    std::vector<char> bytes;  // room for the worst case; only the first `size` are text
    std::size_t size = 0;
};

// The lines of frequencies [first, end), written into bytes (reused from an earlier chunk
// when it has room, so that its pages are not faulted in again). Readings are copied a tile of
// columns at a time, so that each row is read front to back rather than one value from every row
// per line.
LinesText formatLines(const std::vector<double>& frequencies,
                      const std::vector<RowReadings>& readings, std::size_t first, std::size_t end,
                      std::vector<char> bytes) {
    if (bytes.size() < (end - first) * lineRoom(readings)) {
        bytes.resize((end - first) * lineRoom(readings));
    }
    LinesText text{std::move(bytes)};
    char* at = text.bytes.data();
    std::vector<float> tile(readings.size() * kTileWidth);
    for (std::size_t tileStart = first; tileStart < end; tileStart += kTileWidth) {
        const std::size_t width = std::min(kTileWidth, end - tileStart);
        for (std::size_t r = 0; r < readings.size(); ++r) {
            float* out = &tile[r * kTileWidth];
            for (std::size_t c = 0; c < width; ++c) {
                out[c] = readings[r].at(tileStart + c);
            }
        }
        for (std::size_t c = 0; c < width; ++c) {
            at = platform::writeGeneral(at, frequencies[tileStart + c], 15);
            for (std::size_t r = 0; r < readings.size(); ++r) {
                *at++ = ',';
                at = platform::writeFloat8(at, tile[r * kTileWidth + c]);
            }
            *at++ = '\n';
        }
    }
    text.size = static_cast<std::size_t>(at - text.bytes.data());
    return text;
}

}  // namespace

void CCompressionData::writeAllMeasuredData(const std::string& tag,
                                            const std::filesystem::path& directory) const {
    const std::string name = measuredDataFileName(tag);
    platform::WholeFile file(directory / name, "the raw measured data " + name);
    std::string header = "Freq";
    for (double power : m_powerLevels) {
        const std::string p = platform::generalText(power, 6);
        header += ",Rec Pow(" + p + "),Mag(" + p + "),Phase(" + p + ")";
    }
    header += '\n';
    file.write(header);

    const std::size_t rows = m_ratioMag.size();
    std::vector<RowReadings> readings;  // per level: test, ratio, phase
    readings.reserve(3 * rows);
    for (std::size_t i = 0; i < rows; ++i) {
        readings.push_back(rowOf(m_testMag, i));
        readings.push_back(rowOf(m_ratioMag, i));
        readings.push_back(rowOf(m_phase, i));
    }

    // Chunks of lines are formatted on other threads while the finished ones are written in
    // order; a few chunks in flight keep the memory bounded whatever the data size.
    const std::size_t n = m_frequencies.size();
    const std::size_t chunkRows =
        std::max(kTileWidth, kChunkRoom / lineRoom(readings) / kTileWidth * kTileWidth);
    std::vector<std::vector<char>> spare;
    std::deque<std::future<LinesText>> formatting;
    const auto writeOldest = [&] {
        LinesText text = formatting.front().get();
        formatting.pop_front();
        spare.push_back(std::move(text.bytes));
        file.write(std::string_view(spare.back().data(), text.size));
    };
    for (std::size_t first = 0; first < n; first += chunkRows) {
        const std::size_t end = std::min(n, first + chunkRows);
        std::vector<char> bytes;
        if (!spare.empty()) {
            bytes = std::move(spare.back());
            spare.pop_back();
        }
        formatting.push_back(std::async(
            std::launch::async, [this, &readings, first, end, bytes = std::move(bytes)]() mutable {
                return formatLines(m_frequencies, readings, first, end, std::move(bytes));
            }));
        if (formatting.size() > kChunksInFlight) {
            writeOldest();
        }
    }
    while (!formatting.empty()) {
        writeOldest();
    }
    file.commit();
}

}  // namespace engine
