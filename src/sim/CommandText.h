#pragma once

// Small pieces the instrument's command handlers share: reply texts and parameter checks.

#include <cmath>
#include <string>

#include "scpi/CommandTable.h"
#include "scpi/NumberFormat.h"

namespace sim {

inline std::string inQuotes(const std::string& text) {
    return scpi::quotedString(text);
}

inline std::string boolText(bool on) {
    return on ? "1" : "0";
}

// Numbers in replies as the analyzer writes them (NR3, 12 significant digits).
inline std::string nr3(double value) {
    std::string text;
    scpi::appendNr3(text, value);
    return text;
}

inline int integerIn(double value, int low, int high) {
    if (!(value >= low && value <= high) || std::floor(value) != value) {
        throw scpi::Error{-222, "Data out of range"};
    }
    return static_cast<int>(value);
}

// The instrument has one channel: a header naming another is refused.
inline void requireChannel(const scpi::CommandContext& c, std::size_t index = 0) {
    if (c.suffix(index) != 1) {
        throw scpi::Error{
            -114, "Header suffix out of range; no channel " + std::to_string(c.suffix(index))};
    }
}

}  // namespace sim
