#include "scpi/NumberFormat.h"

#include <algorithm>
#include <bit>
#include <charconv>
#include <cstdint>

#include "scpi/Block.h"
#include "scpi/ProgramMessage.h"

namespace scpi {
namespace {

// "+d.dddddddddddE+ddd" is 19 characters; NaN and infinities are shorter.
constexpr std::size_t nr3Bytes = 19;

bool isBlank(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n';
}

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && isBlank(text.front())) {
        text.remove_prefix(1);
    }
    while (!text.empty() && isBlank(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

// Writes one NR3 number at `p` (room for nr3Bytes) and returns its end. to_chars gives
// printf's digits; printf also writes a "+" and upper-case letters.
char* writeNr3(char* p, double value) {
    char* first = p;
    auto [end, ec] =
        std::to_chars(p + 1, p + 1 + nr3Bytes, value, std::chars_format::scientific, 11);
    if (p[1] == '-') {
        std::copy(p + 1, end, p);
        --end;
    } else {
        *p = '+';
    }
    for (char* c = first + 1; c < end; ++c) {
        if (*c >= 'a' && *c <= 'z') {
            *c = static_cast<char>(*c - 'a' + 'A');
        }
    }
    return end;
}

template <typename Bits>
char* writeBits(char* p, Bits bits, ByteOrder order) {
    for (std::size_t i = 0; i < sizeof(Bits); ++i) {
        std::size_t shift = order == ByteOrder::Normal ? 8 * (sizeof(Bits) - 1 - i) : 8 * i;
        p[i] = static_cast<char>(static_cast<std::uint8_t>(bits >> shift));
    }
    return p + sizeof(Bits);
}

template <typename Bits>
Bits readBits(const char* p, ByteOrder order) {
    Bits bits = 0;
    for (std::size_t i = 0; i < sizeof(Bits); ++i) {
        std::size_t shift = order == ByteOrder::Normal ? 8 * (sizeof(Bits) - 1 - i) : 8 * i;
        bits |= static_cast<Bits>(static_cast<std::uint8_t>(p[i])) << shift;
    }
    return bits;
}

template <typename Value>
void appendAll(std::string& out, std::span<const Value> values, DataFormat format,
               ByteOrder order) {
    std::size_t start = out.size();
    if (format == DataFormat::Ascii) {
        out.resize(start + values.size() * (nr3Bytes + 1));
        char* p = out.data() + start;
        for (std::size_t i = 0; i < values.size(); ++i) {
            if (i > 0) {
                *p++ = ',';
            }
            p = writeNr3(p, static_cast<double>(values[i]));
        }
        out.resize(static_cast<std::size_t>(p - out.data()));
        return;
    }
    std::size_t size = format == DataFormat::Real32 ? 4 : 8;
    appendBlockHeader(out, values.size() * size);
    start = out.size();
    out.resize(start + values.size() * size);
    char* p = out.data() + start;
    for (Value value : values) {
        if (format == DataFormat::Real32) {
            p = writeBits(p, std::bit_cast<std::uint32_t>(static_cast<float>(value)), order);
        } else {
            p = writeBits(p, std::bit_cast<std::uint64_t>(static_cast<double>(value)), order);
        }
    }
}

Error notANumber(std::size_t index, std::string_view text) {
    return Error{-104, "Data type error; value " + std::to_string(index + 1) + " (\"" +
                           std::string(text.substr(0, 40)) + "\") is not a number"};
}

double parseValue(std::string_view text, std::size_t index) {
    const char* first = text.data();
    const char* last = first + text.size();
    if (text.size() > 2 && text[0] == '#') {
        int base = 0;
        switch (text[1] | 0x20) {
            case 'h':
                base = 16;
                break;
            case 'q':
                base = 8;
                break;
            case 'b':
                base = 2;
                break;
        }
        std::uint64_t value = 0;
        auto [end, ec] = std::from_chars(first + 2, last, value, base == 0 ? 10 : base);
        if (base == 0 || ec != std::errc() || end != last) {
            throw notANumber(index, text);
        }
        return static_cast<double>(value);
    }
    if (last - first > 1 && *first == '+' && first[1] != '-') {
        ++first;
    }
    double value = 0.0;
    auto [end, ec] = std::from_chars(first, last, value);
    if (ec != std::errc() || end != last || first == last) {
        throw notANumber(index, text);
    }
    return value;
}

std::vector<double> decodeAscii(std::string_view text) {
    std::vector<double> values;
    if (text.empty()) {
        return values;
    }
    values.reserve(static_cast<std::size_t>(std::count(text.begin(), text.end(), ',')) + 1);
    std::size_t start = 0;
    for (;;) {
        std::size_t comma = std::min(text.find(',', start), text.size());
        std::string_view item = text.substr(start, comma - start);
        values.push_back(parseValue(trimmed(item), values.size()));
        if (comma == text.size()) {
            return values;
        }
        start = comma + 1;
    }
}

std::vector<double> decodeReal(std::string_view text, std::size_t size, ByteOrder order) {
    if (text.empty() || text.front() != '#') {
        throw Error{-104, "Data type error; a REAL," + std::to_string(8 * size) +
                              " response is a block starting with #"};
    }
    auto header = readBlockHeader(text);
    if (!header) {
        throw Error{-161, "Invalid block data; the block header is cut short"};
    }
    std::size_t available = text.size() - std::min(text.size(), header->headerBytes);
    if (available < header->dataBytes) {
        throw Error{-161, "Invalid block data; block announces " +
                              std::to_string(header->dataBytes) + " bytes but only " +
                              std::to_string(available) + " arrived"};
    }
    // A response read off the wire may still end with its newline, or CR LF.
    std::string_view after = text.substr(header->headerBytes + header->dataBytes);
    if (!trimmed(after).empty()) {
        throw Error{-161, "Invalid block data; " + std::to_string(after.size()) +
                              " bytes follow the block of " + std::to_string(header->dataBytes) +
                              " bytes"};
    }
    if (header->dataBytes % size != 0) {
        throw Error{-161, "Invalid block data; block of " + std::to_string(header->dataBytes) +
                              " bytes is not a whole number of " + std::to_string(size) +
                              "-byte values"};
    }
    std::vector<double> values(header->dataBytes / size);
    const char* p = text.data() + header->headerBytes;
    for (double& value : values) {
        value = size == 4 ? std::bit_cast<float>(readBits<std::uint32_t>(p, order))
                          : std::bit_cast<double>(readBits<std::uint64_t>(p, order));
        p += size;
    }
    return values;
}

}  // namespace

void appendNr3(std::string& out, double value) {
    char buffer[nr3Bytes + 1];
    out.append(buffer, writeNr3(buffer, value));
}

void appendValues(std::string& out, std::span<const double> values, DataFormat format,
                  ByteOrder order) {
    appendAll(out, values, format, order);
}

void appendValues(std::string& out, std::span<const float> values, DataFormat format,
                  ByteOrder order) {
    appendAll(out, values, format, order);
}

std::vector<double> decodeValues(std::string_view response, DataFormat format, ByteOrder order) {
    switch (format) {
        case DataFormat::Real32:
            return decodeReal(response, 4, order);
        case DataFormat::Real64:
            return decodeReal(response, 8, order);
        case DataFormat::Ascii:
            break;
    }
    return decodeAscii(trimmed(response));
}

}  // namespace scpi
