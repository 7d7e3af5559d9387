#pragma once

// Numbers in texts: written as a C++ stream writes them in its default notation with a given
// precision (printf's %.Ng; the stream default is 6), appended without allocating; read back
// with atoi/atof semantics (the valid leading part, or 0).

#include <cstddef>
#include <string>

namespace platform {

void appendGeneral(std::string& out, double value, int significantDigits);
std::string generalText(double value, int significantDigits = 6);
// appendGeneral(out, value, 8) for a float, without the general-purpose formatter's cost;
// byte-identical to it.
void appendFloat8(std::string& out, float value);

// Bulk writers for large exports: the same texts written at `out`, returning the end of the
// text. Each may store whole words past that end, so `out` needs kNumberRoom writable bytes.
inline constexpr std::size_t kNumberRoom = 48;
// significantDigits from 1 to 17.
char* writeGeneral(char* out, double value, int significantDigits);
char* writeFloat8(char* out, float value);

// The leading integer of text, 0 when there is none; out-of-range values saturate.
int leadingInteger(const std::string& text);
// The leading decimal number of text, 0 when there is none.
double leadingDouble(const std::string& text);

}  // namespace platform
