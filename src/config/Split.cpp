#include "config/Split.h"

int Split(const std::string& text, std::vector<std::string>& tokens, const std::string& delimiters,
          char grouping) {
    tokens.clear();
    std::size_t pos = 0;
    while (pos < text.size()) {
        pos = text.find_first_not_of(delimiters, pos);
        if (pos == std::string::npos) {
            break;
        }
        if (text[pos] == grouping) {
            std::size_t close = text.find(grouping, pos + 1);
            if (close == std::string::npos) {
                // An unclosed group adds nothing; scanning goes on after it opened.
                ++pos;
                continue;
            }
            if (close > pos + 1) {
                tokens.push_back(text.substr(pos + 1, close - pos - 1));
            }
            pos = close + 1;
            continue;
        }
        std::size_t end = text.find_first_of(delimiters, pos);
        if (end == std::string::npos) {
            end = text.size();
        }
        tokens.push_back(text.substr(pos, end - pos));
        pos = end;
    }
    return static_cast<int>(tokens.size());
}

int SplitWords(const std::string& text, std::vector<std::string>& words) {
    return Split(text, words, " \t", '"');
}

std::vector<std::string> SplitAtCommas(const std::string& text) {
    std::vector<std::string> pieces;
    std::size_t start = 0;
    for (std::size_t comma = text.find(','); comma != std::string::npos;
         comma = text.find(',', start)) {
        pieces.push_back(text.substr(start, comma - start));
        start = comma + 1;
    }
    pieces.push_back(text.substr(start));
    return pieces;
}
