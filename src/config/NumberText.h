#pragma once

#include <cstdint>
#include <string>

// Narrowing of numbers read from configuration texts (platform/NumberText.h reads them).
// A double narrowed to float; magnitudes beyond float become infinite instead of undefined.
float ToFloat(double value);
// Truncates toward zero; throws a text naming what when the value has no 32-bit integer.
std::int32_t TruncateToInt(double value, const std::string& what);
