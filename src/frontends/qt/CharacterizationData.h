#pragma once

// A stored receiver characterization as the plots read it: from the binary image of a
// per-port data file (11-word header, 28-word records) or from an export text file.

#include <array>
#include <filesystem>
#include <string>
#include <vector>

#include "storage/RcvrCharImage.h"

namespace qtui {

inline constexpr std::size_t kLevelCount = storage::kCompressionLevels;
// Compression levels of a record, in record order.
inline constexpr std::array<double, kLevelCount> kCompressionLevelsDb{0.05, 0.1, 0.2, 0.5};

struct CharacterizationRecord {
    double frequency = 0;  // Hz
    storage::RecordPoints levels{};
    // True when every value is zero: a low-frequency record or a defaulted one.
    bool empty() const;
};

struct CharacterizationData {
    std::string receiver;
    double narrowbandLoss = 0;
    double attenuator = 0;
    std::vector<CharacterizationRecord> records;

    // Records that carry compression data, in frequency order of the file.
    std::vector<const CharacterizationRecord*> measuredRecords() const;
    // Frequencies where the measured frequency grid starts, ends or changes its step:
    // the edges of the measured bands.
    std::vector<double> bandEdges() const;
};

// Takes the records of a stored image. Raises an error text naming the defect when the
// image is not complete.
CharacterizationData fromImage(const storage::RcvrCharImage& image);
// Parses the text of an export (or raw result) file.
CharacterizationData parseExportText(const std::string& text);
// Reads either kind of file; the first byte tells them apart.
CharacterizationData loadCharacterization(const std::filesystem::path& path);

}  // namespace qtui
