#include "engine/MeasuredDataImport.h"

#include <charconv>
#include <fstream>
#include <string_view>

#include "platform/NumberText.h"

namespace engine {

namespace {

class CsvLines {
  public:
    explicit CsvLines(const std::filesystem::path& file) : m_file(file), m_in(file) {
        if (!m_in) {
            throw std::string("Cannot open the measured data file " + file.string());
        }
    }
    bool next(std::string& line) {
        if (!std::getline(m_in, line)) {
            return false;
        }
        ++m_number;
        if (!line.empty() && line.back() == '\r') {
            line.pop_back();
        }
        return true;
    }
    [[noreturn]] void fail(const std::string& what) const {
        throw std::string(m_file.string() + " line " + std::to_string(m_number) + ": " + what);
    }

  private:
    std::filesystem::path m_file;
    std::ifstream m_in;
    std::size_t m_number = 0;
};

// Splits at commas into views of line.
void splitCells(std::string_view line, std::vector<std::string_view>& cells) {
    cells.clear();
    std::size_t start = 0;
    while (true) {
        const auto comma = line.find(',', start);
        cells.push_back(
            line.substr(start, comma == std::string_view::npos ? comma : comma - start));
        if (comma == std::string_view::npos) {
            return;
        }
        start = comma + 1;
    }
}

// A line as an error message may show it: at most 80 characters, other bytes than
// printable ASCII as \xNN, so that a binary file never reaches the terminal raw.
std::string shown(std::string_view line) {
    std::string text;
    for (char c : line.substr(0, 80)) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte >= 0x20 && byte < 0x7F) {
            text += c;
        } else {
            constexpr char hex[] = "0123456789ABCDEF";
            text += "\\x";
            text += hex[byte >> 4];
            text += hex[byte & 0xF];
        }
    }
    return line.size() > 80 ? text + "..." : text;
}

template <typename T>
bool parseNumber(std::string_view text, T& value) {
    const auto result = std::from_chars(text.data(), text.data() + text.size(), value);
    return result.ec == std::errc() && result.ptr == text.data() + text.size();
}

}  // namespace

void readAllMeasuredData(CCompressionData& store, const std::filesystem::path& file) {
    CsvLines lines(file);
    const auto& ladder = store.getPowerLevels();
    const std::size_t levels = ladder.size();
    std::string line;
    std::vector<std::string_view> cells;
    if (!lines.next(line)) {
        lines.fail("the file is empty");
    }
    splitCells(line, cells);
    if (cells.empty() || cells[0] != "Freq" || cells.size() != 1 + 3 * levels) {
        lines.fail("the header does not name the " + std::to_string(levels) +
                   " power levels of the ladder: " + shown(line));
    }
    for (std::size_t i = 0; i < levels; ++i) {
        const std::string expected = "Rec Pow(" + platform::generalText(ladder[i]) + ")";
        if (cells[1 + 3 * i] != expected) {
            lines.fail("header column " + std::to_string(2 + 3 * i) + " is \"" +
                       shown(cells[1 + 3 * i]) + "\", the ladder gives \"" + expected + "\"");
        }
    }

    const auto& frequencies = store.getFrequencies();
    CCompressionData::Table test(levels), ratio(levels), phase(levels);
    for (std::size_t i = 0; i < levels; ++i) {
        test[i].reserve(frequencies.size());
        ratio[i].reserve(frequencies.size());
        phase[i].reserve(frequencies.size());
    }
    std::string planText;
    std::size_t row = 0;
    while (lines.next(line)) {
        if (line.empty()) {
            continue;
        }
        splitCells(line, cells);
        if (row >= frequencies.size()) {
            lines.fail("more frequencies than the " + std::to_string(frequencies.size()) +
                       " the band plan measures");
        }
        planText.clear();
        platform::appendGeneral(planText, frequencies[row], 15);
        if (cells[0] != planText) {
            lines.fail("frequency " + shown(cells[0]) + " differs from the band plan's " +
                       planText);
        }
        if (cells.size() != 1 + 3 * levels) {
            lines.fail("expected " + std::to_string(1 + 3 * levels) + " cells, found " +
                       std::to_string(cells.size()));
        }
        for (std::size_t i = 0; i < levels; ++i) {
            float values[3];
            for (std::size_t c = 0; c < 3; ++c) {
                if (!parseNumber(cells[1 + 3 * i + c], values[c])) {
                    lines.fail("cell " + std::to_string(2 + 3 * i + c) + " \"" +
                               shown(cells[1 + 3 * i + c]) + "\" is not a number");
                }
            }
            test[i].push_back(values[0]);
            ratio[i].push_back(values[1]);
            phase[i].push_back(values[2]);
        }
        ++row;
    }
    if (row != frequencies.size()) {
        lines.fail("the file ends after " + std::to_string(row) +
                   " frequencies; the band plan "
                   "measures " +
                   std::to_string(frequencies.size()));
    }
    store.clearMeasurements();
    for (std::size_t i = 0; i < levels; ++i) {
        const int level = static_cast<int>(i);
        store.putTrace("TestMag", test[i], level);
        store.putTrace("RatioMag", ratio[i], level);
        store.putTrace("Phase", phase[i], level);
    }
}

}  // namespace engine
