#pragma once

// SHA-256 (FIPS 180-4), so that a backup can say which bytes it holds without a crypto library.

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

namespace platform {

class Sha256 {
  public:
    Sha256();
    void update(std::string_view bytes);
    // The digest as 64 lower-case hex digits; the object is spent afterwards.
    std::string hexDigest();

  private:
    void compress(const unsigned char* block);

    std::array<std::uint32_t, 8> m_state;
    std::array<unsigned char, 64> m_block{};
    std::size_t m_blockSize = 0;
    std::uint64_t m_totalBytes = 0;
};

// The hex digest of the bytes in one call.
std::string sha256Hex(std::string_view bytes);

}  // namespace platform
