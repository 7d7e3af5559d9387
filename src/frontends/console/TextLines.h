#pragma once

// Small text helpers of the console front end.

#include <string>
#include <vector>

namespace console {

// Lines without their "\n" or "\r\n"; a final line feed does not start another line.
std::vector<std::string> splitLines(const std::string& text);
std::string trim(const std::string& text);
std::string upperCase(std::string text);
// "\r\n" becomes "\n": log notices carry the analyzer computer's line ends.
std::string terminalLineEnds(const std::string& text);

}  // namespace console
