#pragma once

// Numbers as a C++ stream writes them in its default notation with a given precision
// (printf's %.Ng), appended without allocating.

#include <string>

namespace engine {

void appendGeneral(std::string& out, double value, int significantDigits);
std::string generalText(double value, int significantDigits = 6);
// appendGeneral(out, value, 8) for a float, without the general-purpose formatter's cost;
// byte-identical to it.
void appendFloat8(std::string& out, float value);

}  // namespace engine
