#include <cstdio>
#include <memory>
#include <vector>

#include "engine/CompressionData.h"
#include "platform/NumberText.h"

namespace engine {

std::string CCompressionData::measuredDataFileName(const std::string& tag) {
    return "RcvrChar_AllMeasuredData_" + tag + ".csv";
}

namespace {

struct FileCloser {
    void operator()(std::FILE* file) const { std::fclose(file); }
};

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

}  // namespace

void CCompressionData::writeAllMeasuredData(const std::string& tag,
                                            const std::filesystem::path& directory) const {
    std::unique_ptr<std::FILE, FileCloser> file(
        std::fopen((directory / measuredDataFileName(tag)).c_str(), "wb"));
    if (!file) {
        return;
    }
    std::string header = "Freq";
    for (double power : m_powerLevels) {
        const std::string p = platform::generalText(power, 6);
        header += ",Rec Pow(" + p + "),Mag(" + p + "),Phase(" + p + ")";
    }
    header += '\n';
    std::fwrite(header.data(), 1, header.size(), file.get());

    const std::size_t rows = m_ratioMag.size();
    std::vector<RowReadings> readings;  // per level: test, ratio, phase
    readings.reserve(3 * rows);
    for (std::size_t i = 0; i < rows; ++i) {
        readings.push_back(rowOf(m_testMag, i));
        readings.push_back(rowOf(m_ratioMag, i));
        readings.push_back(rowOf(m_phase, i));
    }

    // Rows are formatted straight into a block written out whenever it fills, so the memory
    // stays bounded whatever the data size. A row never needs more than rowRoom bytes.
    const std::size_t rowRoom = (readings.size() + 1) * (platform::kNumberRoom + 1) + 1;
    constexpr std::size_t flushAt = 1 << 20;
    std::vector<char> block(flushAt + rowRoom);
    char* const begin = block.data();
    char* at = begin;
    // Readings are copied a tile of columns at a time, so that each row is read front to back
    // rather than one value from every row per line.
    constexpr std::size_t tileWidth = 64;
    std::vector<float> tile(readings.size() * tileWidth);
    for (std::size_t first = 0; first < m_frequencies.size(); first += tileWidth) {
        const std::size_t width = std::min(tileWidth, m_frequencies.size() - first);
        for (std::size_t r = 0; r < readings.size(); ++r) {
            float* out = &tile[r * tileWidth];
            for (std::size_t c = 0; c < width; ++c) {
                out[c] = readings[r].at(first + c);
            }
        }
        for (std::size_t c = 0; c < width; ++c) {
            at = platform::writeGeneral(at, m_frequencies[first + c], 15);
            for (std::size_t r = 0; r < readings.size(); ++r) {
                *at++ = ',';
                at = platform::writeFloat8(at, tile[r * tileWidth + c]);
            }
            *at++ = '\n';
            if (static_cast<std::size_t>(at - begin) >= flushAt) {
                std::fwrite(begin, 1, static_cast<std::size_t>(at - begin), file.get());
                at = begin;
            }
        }
    }
    std::fwrite(begin, 1, static_cast<std::size_t>(at - begin), file.get());
}

}  // namespace engine
