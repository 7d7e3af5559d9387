#pragma once

// SCPI message syntax as an instrument reads it: program message units split at
// semicolons, a header of colon-separated mnemonics (with "?" for queries), and parameters:
// quoted strings, numbers in any SCPI form (with unit suffixes), booleans, words and
// definite-length blocks.

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace scpi {

// Keywords and words compare as the "C" locale upper-cases them.
std::string upperCased(std::string_view text);

// Text as a quoted string parameter or reply: in double quotes, each quote inside doubled.
std::string quotedString(std::string_view text);

// An instrument-side error: queued as code,"message"; never leaves the parser.
struct Error {
    int code;
    std::string message;
};

// Units of one message, split at semicolons outside quoted strings and definite-length
// blocks; empty units dropped. Never throws: a malformed block is left for the parameter
// reader to report.
std::vector<std::string_view> splitMessageUnits(std::string_view message);

struct CommandHeader {
    std::vector<std::string_view> nodes;  // e.g. "SENS", "PATH", ... (common: "*IDN")
    bool query = false;
    std::string_view parameters;  // everything after the header's white space
};

// Throws Error -102 for an empty or malformed header.
CommandHeader parseHeader(std::string_view unit);

class ParameterReader {
  public:
    explicit ParameterReader(std::string_view text) : m_text(text) {}

    bool atEnd();
    // A quoted string ("..." or '...'; a doubled quote inside stands for one).
    std::string string();
    double number();
    bool boolean();
    // The bytes of a definite-length block. Throws -104 when the parameter is not a block,
    // -161 when its header is bad or its data is shorter than announced.
    std::string_view block();
    // Character data, upper-cased.
    std::string word();
    // The next parameter if it is an unsigned integer that fits 16 bits; false at the end.
    // Throws -104 for a non-number and -222 for a value out of range. No allocation.
    bool nextWord(std::uint16_t& word);
    // Raises -108 when parameters remain.
    void finish();

  private:
    void skipBlanks();
    void expectParameter();
    // After a parameter: a comma (another one follows) or the end.
    void endParameter();
    std::string_view rawToken();

    std::string_view m_text;
    std::size_t m_pos = 0;
    bool m_needParameter = false;
};

}  // namespace scpi
