#pragma once

// IEEE 488.2 definite-length arbitrary blocks: "#", one digit n (1 to 9), n digits of
// length, then that many bytes. The indefinite form "#0" ends only with END, which a byte
// stream cannot carry, so it is refused.

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace scpi {

// The largest block either side accepts: a few 100,001-point complex traces in REAL,64.
constexpr std::size_t maxBlockBytes = 64u << 20;

// Appends "#<n><length>" so a writer can put the payload right after it without a copy.
// Throws Error -223 for a length beyond 9 digits.
void appendBlockHeader(std::string& out, std::size_t length);
void appendBlock(std::string& out, std::string_view bytes);

struct BlockHeader {
    std::size_t headerBytes;  // "#", the digit count and the length digits
    std::size_t dataBytes;
};

// Reads the header at the start of `text` (which starts at "#"). Returns nullopt while the
// header is incomplete; throws Error -161 for a malformed header, for "#0" and for a length
// above maxBlockBytes, before anything would be allocated for it.
std::optional<BlockHeader> readBlockHeader(std::string_view text);

}  // namespace scpi
