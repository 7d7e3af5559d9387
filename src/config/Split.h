#pragma once

#include <string>
#include <vector>

// Splits text into tokens separated by runs of delimiter characters; a token that starts
// with the grouping character runs to the next one and keeps delimiters inside. The list is
// emptied first; the result is the number of tokens. Empty tokens never occur.
int Split(const std::string& text, std::vector<std::string>& tokens, const std::string& delimiters,
          char grouping);

// Split at blanks and tabs, with double quotes grouping.
int SplitWords(const std::string& text, std::vector<std::string>& words);

// Every piece between commas, empty ones included: "a,,b," gives "a", "", "b", "".
std::vector<std::string> SplitAtCommas(const std::string& text);
