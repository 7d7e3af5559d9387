#pragma once

// Numbers in SCPI texts: written as a default-configured output stream writes a double
// (six significant digits, no trailing zeros), read back with atoi/atof semantics (the
// valid leading part, or 0).

#include <string>

namespace analyzer {

void appendStreamNumber(std::string& out, double value);
std::string streamNumber(double value);

// The leading integer of text, 0 when there is none; out-of-range values saturate.
int leadingInteger(const std::string& text);
// The leading decimal number of text, 0 when there is none.
double leadingDouble(const std::string& text);

}  // namespace analyzer
