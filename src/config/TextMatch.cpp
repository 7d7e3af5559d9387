#include "config/TextMatch.h"

std::string ToUpper(std::string text) {
    for (char& c : text) {
        if (c >= 'a' && c <= 'z') {
            c = static_cast<char>(c - 'a' + 'A');
        }
    }
    return text;
}

bool ContainsNoCase(const std::string& text, const std::string& key) {
    return ToUpper(text).find(ToUpper(key)) != std::string::npos;
}
