#pragma once

// Trace data as the analyzer writes and reads it: FORM:DATA ASC,0 (NR3 numbers joined by
// commas), REAL,32 or REAL,64 (one definite-length block of IEEE 754 values), in the byte
// order FORM:BORD sets: NORM is big-endian, the analyzer's default; SWAP is little-endian.

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace scpi {

enum class DataFormat { Ascii, Real32, Real64 };
enum class ByteOrder { Normal, Swapped };

// The analyzer's reply number, byte for byte what printf's "%+.11E" writes
// (e.g. "-2.50000000000E+01").
void appendNr3(std::string& out, double value);

// REAL,32 rounds doubles to float; values beyond float's range become infinities.
void appendValues(std::string& out, std::span<const double> values, DataFormat format,
                  ByteOrder order);
void appendValues(std::string& out, std::span<const float> values, DataFormat format,
                  ByteOrder order);

// The inverse of appendValues. ASCII takes any SCPI numeric form (NR1, NR2, NR3, #H, #Q,
// #B); blanks around values and a trailing newline are ignored. Throws Error -104 for a
// value that is not a number or a response that is not a block, -161 for a bad block.
std::vector<double> decodeValues(std::string_view response, DataFormat format, ByteOrder order);

}  // namespace scpi
