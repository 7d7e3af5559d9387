#include "analyzer/NumberText.h"

#include <charconv>
#include <climits>
#include <cstdlib>

namespace analyzer {

void appendStreamNumber(std::string& out, double value) {
    char buffer[32];
    auto result =
        std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general, 6);
    out.append(buffer, result.ptr);
}

std::string streamNumber(double value) {
    std::string text;
    appendStreamNumber(text, value);
    return text;
}

int leadingInteger(const std::string& text) {
    long value = std::strtol(text.c_str(), nullptr, 10);
    if (value > INT_MAX) {
        return INT_MAX;
    }
    if (value < INT_MIN) {
        return INT_MIN;
    }
    return static_cast<int>(value);
}

double leadingDouble(const std::string& text) {
    return std::strtod(text.c_str(), nullptr);
}

}  // namespace analyzer
