#include "config/TextMatch.h"

#include <algorithm>

namespace {

char UpperChar(char c) {
    return (c >= 'a' && c <= 'z') ? static_cast<char>(c - 'a' + 'A') : c;
}

}  // namespace

std::string ToUpper(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(), UpperChar);
    return text;
}

bool ContainsNoCase(const std::string& text, const std::string& key) {
    // Compared in place: lookups run over every row of the file.
    auto same = [](char a, char b) { return UpperChar(a) == UpperChar(b); };
    return std::search(text.begin(), text.end(), key.begin(), key.end(), same) != text.end();
}
