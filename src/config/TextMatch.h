#pragma once

#include <string>

// Configuration names compare in upper case; only the letters a to z change.
std::string ToUpper(std::string text);

// True when the key occurs in the text, ignoring case; an empty key is in every text.
bool ContainsNoCase(const std::string& text, const std::string& key);
