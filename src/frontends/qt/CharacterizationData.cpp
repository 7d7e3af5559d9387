#include "frontends/qt/CharacterizationData.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <sstream>

namespace qtui {

namespace {

// Reads one number at text[pos], skipping blanks; raises when there is none.
double numberAt(const std::string& line, std::size_t& pos, std::size_t lineNumber) {
    while (pos < line.size() && (line[pos] == ' ' || line[pos] == '\t')) {
        ++pos;
    }
    const char* start = line.c_str() + pos;
    char* end = nullptr;
    double value = std::strtod(start, &end);
    if (end == start) {
        throw std::string("Export text line " + std::to_string(lineNumber) +
                          ": expected a number at \"" + line.substr(pos) + "\"");
    }
    pos += static_cast<std::size_t>(end - start);
    return value;
}

void expectChar(const std::string& line, std::size_t& pos, char wanted, std::size_t lineNumber) {
    while (pos < line.size() && (line[pos] == ' ' || line[pos] == '\t')) {
        ++pos;
    }
    if (pos >= line.size() || line[pos] != wanted) {
        throw std::string("Export text line " + std::to_string(lineNumber) + ": expected '" +
                          std::string(1, wanted) + "' at \"" +
                          (pos < line.size() ? line.substr(pos) : std::string()) + "\"");
    }
    ++pos;
}

CharacterizationRecord parseRecordLine(const std::string& line, std::size_t lineNumber) {
    CharacterizationRecord record;
    std::size_t pos = 0;
    record.frequency = numberAt(line, pos, lineNumber);
    for (auto& point : record.levels) {
        expectChar(line, pos, ',', lineNumber);
        expectChar(line, pos, '(', lineNumber);
        point.power = static_cast<float>(numberAt(line, pos, lineNumber));
        expectChar(line, pos, ',', lineNumber);
        point.value = static_cast<float>(numberAt(line, pos, lineNumber));
        expectChar(line, pos, ',', lineNumber);
        point.phase = static_cast<float>(numberAt(line, pos, lineNumber));
        expectChar(line, pos, ')', lineNumber);
    }
    while (pos < line.size() && std::isspace(static_cast<unsigned char>(line[pos]))) {
        ++pos;
    }
    if (pos != line.size()) {
        throw std::string("Export text line " + std::to_string(lineNumber) + ": more than " +
                          std::to_string(kLevelCount) + " compression triples");
    }
    return record;
}

}  // namespace

bool CharacterizationRecord::empty() const {
    for (const auto& point : levels) {
        if (point.power != 0 || point.value != 0 || point.phase != 0) {
            return false;
        }
    }
    return true;
}

std::vector<const CharacterizationRecord*> CharacterizationData::measuredRecords() const {
    std::vector<const CharacterizationRecord*> result;
    result.reserve(records.size());
    for (const auto& record : records) {
        if (!record.empty()) {
            result.push_back(&record);
        }
    }
    return result;
}

std::vector<double> CharacterizationData::bandEdges() const {
    const auto measured = measuredRecords();
    std::vector<double> edges;
    if (measured.empty()) {
        return edges;
    }
    auto add = [&edges](double f) {
        if (edges.empty() || edges.back() != f) {
            edges.push_back(f);
        }
    };
    add(measured.front()->frequency);
    for (std::size_t i = 1; i + 1 < measured.size(); ++i) {
        const double before = measured[i]->frequency - measured[i - 1]->frequency;
        const double after = measured[i + 1]->frequency - measured[i]->frequency;
        const double scale = std::max(std::fabs(before), std::fabs(after));
        if (std::fabs(after - before) > 1e-6 * scale) {
            add(measured[i]->frequency);
        }
    }
    add(measured.back()->frequency);
    return edges;
}

CharacterizationData fromImage(const storage::RcvrCharImage& image) {
    if (image.completeness() != storage::ImageCompleteness::Complete) {
        throw std::string("Characterization image is not complete: " + image.defect());
    }
    CharacterizationData data;
    data.receiver = image.nameCharacters();
    data.narrowbandLoss = image.narrowbandLoss();
    data.attenuator = image.attenuatorDb();
    const std::size_t count = image.announcedRecords();
    data.records.resize(count);
    for (std::size_t i = 0; i < count; ++i) {
        auto& record = data.records[i];
        record.frequency = image.frequency(i);
        for (std::size_t level = 0; level < kLevelCount; ++level) {
            record.levels[level] = image.point(i, level);
        }
    }
    return data;
}

CharacterizationData parseExportText(const std::string& text) {
    std::istringstream in(text);
    std::string line;
    std::vector<std::string> header;
    while (header.size() < 5 && std::getline(in, line)) {
        if (!line.empty() && line.back() == '\r') {
            line.pop_back();
        }
        header.push_back(line);
    }
    if (header.size() < 5) {
        throw std::string("Export text has " + std::to_string(header.size()) +
                          " header lines; expected 5 (version, receiver, 25, loss, attenuator)");
    }
    if (std::atoi(header[0].c_str()) != 1) {
        throw std::string("Export text starts with \"" + header[0] + "\"; expected 1");
    }
    CharacterizationData data;
    data.receiver = header[1];
    data.narrowbandLoss = std::atof(header[3].c_str());
    data.attenuator = std::atof(header[4].c_str());
    std::size_t lineNumber = 5;
    while (std::getline(in, line)) {
        ++lineNumber;
        if (line.find_first_not_of(" \t\r") == std::string::npos) {
            continue;
        }
        data.records.push_back(parseRecordLine(line, lineNumber));
    }
    return data;
}

CharacterizationData loadCharacterization(const std::filesystem::path& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        throw std::string("Cannot open characterization file " + path.string());
    }
    const std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (bytes.empty()) {
        throw std::string("Characterization file " + path.string() + " is empty");
    }
    // A binary image starts with the word 1 (bytes 01 00); a text file with the digit '1'.
    if (bytes[0] == '\x01') {
        return fromImage(storage::RcvrCharImage::fromBytes(bytes));
    }
    return parseExportText(bytes);
}

}  // namespace qtui
