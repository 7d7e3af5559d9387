#include "scpi/ProgramMessage.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>

#include "scpi/Block.h"

namespace scpi {
namespace {

bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n';
}

struct Suffix {
    const char* text;
    double factor;
};

// Unit suffixes with their multipliers; "MHZ" is mega as SCPI defines it.
constexpr Suffix suffixes[] = {
    {"GHZ", 1e9}, {"MHZ", 1e6}, {"KHZ", 1e3}, {"HZ", 1.0},   {"DBM", 1.0}, {"DB", 1.0},
    {"MS", 1e-3}, {"US", 1e-6}, {"NS", 1e-9}, {"PS", 1e-12}, {"S", 1.0},   {"G", 1e9},
    {"MA", 1e6},  {"K", 1e3},   {"M", 1e-3},  {"U", 1e-6},   {"N", 1e-9},
};

// Where the definite-length block whose "#" is at `hash` ends (clamped to the text), or
// npos when no well-formed block starts there: "#H1F" is a hexadecimal number, and a bad
// header is left for ParameterReader::block() to report.
std::size_t blockEnd(std::string_view text, std::size_t hash) {
    if (hash + 1 >= text.size() || text[hash + 1] < '1' || text[hash + 1] > '9') {
        return std::string_view::npos;
    }
    try {
        auto header = readBlockHeader(text.substr(hash));
        if (!header) {
            return std::string_view::npos;
        }
        return hash + std::min(text.size() - hash, header->headerBytes + header->dataBytes);
    } catch (const Error&) {
        return std::string_view::npos;
    }
}

}  // namespace

std::string quotedString(std::string_view text) {
    std::string out;
    out.reserve(text.size() + 2);
    out += '"';
    for (char c : text) {
        out += c;
        if (c == '"') {
            out += '"';
        }
    }
    out += '"';
    return out;
}

std::string upperCased(std::string_view text) {
    std::string upper(text);
    for (char& c : upper) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    return upper;
}

std::vector<std::string_view> splitMessageUnits(std::string_view message) {
    std::vector<std::string_view> units;
    char quote = 0;
    std::size_t start = 0;
    // Trailing blanks are trimmed only after the unit's last block: its bytes are data.
    std::size_t lastBlockEnd = 0;
    auto add = [&](std::size_t end) {
        std::string_view unit = message.substr(start, end - start);
        std::size_t keep = lastBlockEnd > start ? lastBlockEnd - start : 0;
        while (unit.size() > keep && isBlank(unit.back())) {
            unit.remove_suffix(1);
        }
        while (!unit.empty() && isBlank(unit.front())) {
            unit.remove_prefix(1);
        }
        if (!unit.empty()) {
            units.push_back(unit);
        }
    };
    for (std::size_t i = 0; i < message.size(); ++i) {
        char c = message[i];
        if (quote) {
            if (c == quote) {
                quote = 0;
            }
        } else if (c == '"' || c == '\'') {
            quote = c;
        } else if (c == '#') {
            std::size_t end = blockEnd(message, i);
            if (end != std::string_view::npos) {
                lastBlockEnd = end;
                i = end - 1;
            }
        } else if (c == ';') {
            add(i);
            start = i + 1;
        }
    }
    add(message.size());
    return units;
}

CommandHeader parseHeader(std::string_view unit) {
    CommandHeader header;
    std::size_t end = 0;
    while (end < unit.size() && !isBlank(unit[end])) {
        ++end;
    }
    std::string_view text = unit.substr(0, end);
    header.parameters = unit.substr(end);
    if (!text.empty() && text.back() == '?') {
        header.query = true;
        text.remove_suffix(1);
    }
    if (!text.empty() && text.front() == ':') {
        text.remove_prefix(1);
    }
    if (text.empty()) {
        throw Error{-102, "Syntax error"};
    }
    std::size_t start = 0;
    for (;;) {
        std::size_t colon = text.find(':', start);
        std::string_view node = text.substr(
            start, colon == std::string_view::npos ? std::string_view::npos : colon - start);
        if (node.empty()) {
            throw Error{-102, "Syntax error"};
        }
        for (char c : node) {
            if (!std::isalnum(static_cast<unsigned char>(c)) && c != '_' && c != '*') {
                throw Error{-102, "Syntax error"};
            }
        }
        header.nodes.push_back(node);
        if (colon == std::string_view::npos) {
            break;
        }
        start = colon + 1;
    }
    return header;
}

void ParameterReader::skipBlanks() {
    while (m_pos < m_text.size() && isBlank(m_text[m_pos])) {
        ++m_pos;
    }
}

bool ParameterReader::atEnd() {
    skipBlanks();
    return m_pos >= m_text.size() && !m_needParameter;
}

void ParameterReader::expectParameter() {
    skipBlanks();
    if (m_pos >= m_text.size() || m_text[m_pos] == ',') {
        throw Error{-109, "Missing parameter"};
    }
}

void ParameterReader::endParameter() {
    skipBlanks();
    m_needParameter = false;
    if (m_pos >= m_text.size()) {
        return;
    }
    if (m_text[m_pos] != ',') {
        throw Error{-103, "Invalid separator"};
    }
    ++m_pos;
    m_needParameter = true;
}

std::string_view ParameterReader::rawToken() {
    expectParameter();
    std::size_t start = m_pos;
    while (m_pos < m_text.size() && m_text[m_pos] != ',') {
        ++m_pos;
    }
    std::size_t end = m_pos;
    while (end > start && isBlank(m_text[end - 1])) {
        --end;
    }
    std::string_view token = m_text.substr(start, end - start);
    endParameter();
    return token;
}

std::string ParameterReader::string() {
    expectParameter();
    char quote = m_text[m_pos];
    if (quote != '"' && quote != '\'') {
        throw Error{-104, "Data type error; string expected"};
    }
    std::string value;
    ++m_pos;
    for (;;) {
        if (m_pos >= m_text.size()) {
            throw Error{-151, "Invalid string data; missing closing quote"};
        }
        char c = m_text[m_pos++];
        if (c == quote) {
            if (m_pos < m_text.size() && m_text[m_pos] == quote) {
                value += quote;
                ++m_pos;
                continue;
            }
            break;
        }
        value += c;
    }
    endParameter();
    return value;
}

std::string_view ParameterReader::block() {
    expectParameter();
    if (m_text[m_pos] != '#') {
        throw Error{-104, "Data type error; block expected"};
    }
    std::string_view rest = m_text.substr(m_pos);
    auto header = readBlockHeader(rest);
    if (!header) {
        throw Error{-161, "Invalid block data; the block header is cut short"};
    }
    std::size_t available = rest.size() - std::min(rest.size(), header->headerBytes);
    if (available < header->dataBytes) {
        throw Error{-161, "Invalid block data; block announces " +
                              std::to_string(header->dataBytes) + " bytes but only " +
                              std::to_string(available) + " follow"};
    }
    std::string_view data = rest.substr(header->headerBytes, header->dataBytes);
    m_pos += header->headerBytes + header->dataBytes;
    endParameter();
    return data;
}

double ParameterReader::number() {
    std::string_view token = rawToken();
    if (!token.empty() && token.front() == '+') {
        token.remove_prefix(1);
    }
    double value = 0.0;
    auto [end, ec] = std::from_chars(token.data(), token.data() + token.size(), value);
    if (ec != std::errc() || end == token.data()) {
        throw Error{-104, "Data type error; number expected, got \"" + std::string(token) + "\""};
    }
    std::string_view rest(end, token.data() + token.size() - end);
    while (!rest.empty() && isBlank(rest.front())) {
        rest.remove_prefix(1);
    }
    if (!rest.empty()) {
        std::string unit = upperCased(rest);
        auto suffix = std::find_if(std::begin(suffixes), std::end(suffixes),
                                   [&](const Suffix& s) { return unit == s.text; });
        if (suffix == std::end(suffixes)) {
            throw Error{-131, "Invalid suffix \"" + std::string(rest) + "\""};
        }
        value *= suffix->factor;
    }
    if (!std::isfinite(value)) {
        throw Error{-222, "Data out of range"};
    }
    return value;
}

bool ParameterReader::boolean() {
    std::string_view token = rawToken();
    std::string text = upperCased(token);
    if (text == "ON" || text == "TRUE") {
        return true;
    }
    if (text == "OFF" || text == "FALSE") {
        return false;
    }
    double value = 0.0;
    auto [end, ec] = std::from_chars(token.data(), token.data() + token.size(), value);
    if (ec != std::errc() || end != token.data() + token.size()) {
        throw Error{-224, "Illegal parameter value; ON or OFF expected, got \"" +
                              std::string(token) + "\""};
    }
    return std::lround(value) != 0;
}

std::string ParameterReader::word() {
    std::string_view token = rawToken();
    if (token.front() == '"' || token.front() == '\'') {
        throw Error{-104, "Data type error; character data expected"};
    }
    return upperCased(token);
}

bool ParameterReader::nextWord(std::uint16_t& word) {
    if (atEnd()) {
        return false;
    }
    expectParameter();
    const char* first = m_text.data() + m_pos;
    const char* last = m_text.data() + m_text.size();
    if (*first == '+') {
        ++first;
    }
    unsigned long value = 0;
    auto [end, ec] = std::from_chars(first, last, value);
    if (ec == std::errc::result_out_of_range || (ec == std::errc() && value > 0xFFFF)) {
        throw Error{-222, "Data out of range; flash words are 0 to 65535"};
    }
    m_pos = static_cast<std::size_t>(end - m_text.data());
    skipBlanks();
    if (ec != std::errc() || (m_pos < m_text.size() && m_text[m_pos] != ',')) {
        throw Error{-104, "Data type error; unsigned number expected"};
    }
    word = static_cast<std::uint16_t>(value);
    endParameter();
    return true;
}

void ParameterReader::finish() {
    if (!atEnd()) {
        throw Error{-108, "Parameter not allowed"};
    }
}

}  // namespace scpi
