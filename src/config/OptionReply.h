#pragma once

#include <string>
#include <vector>

// The option codes in the text between the quotes of the analyzer's "*opt?" reply, split at
// commas front to back. An empty text, or an empty text after the last comma, gives the code
// "No Options" in that place.
std::vector<std::string> SplitOptionReply(const std::string& reply);
