#pragma once

#include <cstdint>
#include <string>

// Numbers in configuration texts read like atof/atoi: leading blanks skipped, the longest
// valid prefix converted, no number gives 0. Integers beyond 32 bits saturate.
double TextToDouble(const std::string& text);
std::int32_t TextToInt(const std::string& text);
// A double narrowed to float; magnitudes beyond float become infinite instead of undefined.
float ToFloat(double value);
// Truncates toward zero; throws a text naming what when the value has no 32-bit integer.
std::int32_t TruncateToInt(double value, const std::string& what);
