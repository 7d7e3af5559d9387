#include "scpi/Block.h"

#include <algorithm>
#include <charconv>

#include "scpi/ProgramMessage.h"

namespace scpi {
namespace {

constexpr std::size_t maxLengthDigits = 9;

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

}  // namespace

void appendBlockHeader(std::string& out, std::size_t length) {
    char digits[24];
    auto [end, ec] = std::to_chars(digits, digits + sizeof digits, length);
    std::size_t count = static_cast<std::size_t>(end - digits);
    if (count > maxLengthDigits) {
        throw Error{-223, "Too much data; a block of " + std::to_string(length) +
                              " bytes does not fit a 9-digit length"};
    }
    out += '#';
    out += static_cast<char>('0' + count);
    out.append(digits, count);
}

void appendBlock(std::string& out, std::string_view bytes) {
    appendBlockHeader(out, bytes.size());
    out += bytes;
}

std::optional<BlockHeader> readBlockHeader(std::string_view text) {
    if (text.empty() || text.front() != '#') {
        throw Error{-161, "Invalid block data; a block starts with #"};
    }
    if (text.size() < 2) {
        return std::nullopt;
    }
    char count = text[1];
    if (count == '0') {
        throw Error{-161,
                    "Invalid block data; indefinite-length block #0 is not accepted, send a "
                    "definite-length block"};
    }
    if (!isDigit(count)) {
        throw Error{-161, "Invalid block data; # must be followed by the digit count 1 to 9"};
    }
    std::size_t digits = static_cast<std::size_t>(count - '0');
    std::size_t available = std::min(digits, text.size() - 2);
    std::size_t length = 0;
    for (std::size_t i = 0; i < available; ++i) {
        char c = text[2 + i];
        if (!isDigit(c)) {
            throw Error{-161, "Invalid block data; the length has " + std::to_string(digits) +
                                  " digits but character " + std::to_string(i + 1) +
                                  " of it is not a digit"};
        }
        length = length * 10 + static_cast<std::size_t>(c - '0');
    }
    if (available < digits) {
        return std::nullopt;
    }
    if (length > maxBlockBytes) {
        throw Error{-161, "Invalid block data; block announces " + std::to_string(length) +
                              " bytes, more than the limit of " + std::to_string(maxBlockBytes) +
                              " bytes"};
    }
    return BlockHeader{2 + digits, length};
}

}  // namespace scpi
