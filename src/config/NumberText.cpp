#include "config/NumberText.h"

#include <cmath>
#include <limits>
#include <sstream>

float ToFloat(double value) {
    constexpr double kMax = std::numeric_limits<float>::max();
    if (value > kMax) {
        return std::numeric_limits<float>::infinity();
    }
    if (value < -kMax) {
        return -std::numeric_limits<float>::infinity();
    }
    return static_cast<float>(value);
}

std::int32_t TruncateToInt(double value, const std::string& what) {
    double truncated = std::trunc(value);
    if (!(truncated >= std::numeric_limits<std::int32_t>::min() &&
          truncated <= std::numeric_limits<std::int32_t>::max())) {
        std::ostringstream text;
        text << what << " " << value << " is not a usable whole number";
        throw text.str();
    }
    return static_cast<std::int32_t>(truncated);
}
