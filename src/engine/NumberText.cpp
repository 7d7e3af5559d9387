#include "engine/NumberText.h"

#include <charconv>

namespace engine {

void appendGeneral(std::string& out, double value, int significantDigits) {
    char buffer[64];
    auto result = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general,
                                significantDigits);
    out.append(buffer, result.ptr);
}

std::string generalText(double value, int significantDigits) {
    std::string text;
    appendGeneral(text, value, significantDigits);
    return text;
}

}  // namespace engine
