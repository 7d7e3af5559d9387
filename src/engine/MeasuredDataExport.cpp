#include <cstdio>
#include <memory>

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

// A short row repeats its last reading; a missing row reads as 0.
float readingAt(const CCompressionData::Table& table, std::size_t row, std::size_t column) {
    if (row >= table.size() || table[row].empty()) {
        return 0;
    }
    const auto& values = table[row];
    return values[column < values.size() ? column : values.size() - 1];
}

}  // namespace

void CCompressionData::writeAllMeasuredData(const std::string& tag,
                                            const std::filesystem::path& directory) const {
    std::unique_ptr<std::FILE, FileCloser> file(
        std::fopen((directory / measuredDataFileName(tag)).c_str(), "wb"));
    if (!file) {
        return;
    }
    std::string text = "Freq";
    for (double power : m_powerLevels) {
        const std::string p = platform::generalText(power, 6);
        text += ",Rec Pow(" + p + "),Mag(" + p + "),Phase(" + p + ")";
    }
    text += '\n';

    // Formatted in blocks so the buffer stays small whatever the data size.
    constexpr std::size_t flushAt = 1 << 20;
    text.reserve(flushAt + 4096);
    const std::size_t rows = m_ratioMag.size();
    for (std::size_t j = 0; j < m_frequencies.size(); ++j) {
        platform::appendGeneral(text, m_frequencies[j], 15);
        for (std::size_t i = 0; i < rows; ++i) {
            text += ',';
            platform::appendFloat8(text, readingAt(m_testMag, i, j));
            text += ',';
            platform::appendFloat8(text, readingAt(m_ratioMag, i, j));
            text += ',';
            platform::appendFloat8(text, readingAt(m_phase, i, j));
        }
        text += '\n';
        if (text.size() >= flushAt) {
            std::fwrite(text.data(), 1, text.size(), file.get());
            text.clear();
        }
    }
    std::fwrite(text.data(), 1, text.size(), file.get());
}

}  // namespace engine
