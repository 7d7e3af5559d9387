#include "lan/Xdr.h"

namespace lan {

namespace {

std::size_t padded(std::size_t length) {
    return (length + 3) & ~std::size_t{3};
}

}  // namespace

void XdrWriter::u32(std::uint32_t value) {
    const char bytes[4] = {static_cast<char>(value >> 24), static_cast<char>(value >> 16),
                           static_cast<char>(value >> 8), static_cast<char>(value)};
    m_out.append(bytes, 4);
}

void XdrWriter::opaque(std::string_view bytes) {
    u32(static_cast<std::uint32_t>(bytes.size()));
    m_out.append(bytes);
    m_out.append(padded(bytes.size()) - bytes.size(), '\0');
}

std::uint32_t XdrReader::u32(const char* what) {
    if (remaining() < 4) {
        throw ProtocolError(std::string("XDR data ends before ") + what);
    }
    const auto* p = reinterpret_cast<const unsigned char*>(m_bytes.data() + m_pos);
    m_pos += 4;
    return (std::uint32_t{p[0]} << 24) | (std::uint32_t{p[1]} << 16) | (std::uint32_t{p[2]} << 8) |
           std::uint32_t{p[3]};
}

bool XdrReader::boolean(const char* what) {
    const std::uint32_t value = u32(what);
    if (value > 1) {
        throw ProtocolError(std::string("XDR boolean ") + what + " is " + std::to_string(value));
    }
    return value == 1;
}

std::string_view XdrReader::opaque(const char* what, std::size_t maxBytes) {
    const std::uint32_t length = u32(what);
    if (length > maxBytes) {
        throw ProtocolError(std::string("XDR ") + what + " of " + std::to_string(length) +
                            " bytes exceeds its bound of " + std::to_string(maxBytes));
    }
    if (padded(length) > remaining()) {
        throw ProtocolError(std::string("XDR ") + what + " announces " + std::to_string(length) +
                            " bytes but only " + std::to_string(remaining()) + " remain");
    }
    const std::string_view bytes = m_bytes.substr(m_pos, length);
    m_pos += padded(length);
    return bytes;
}

}  // namespace lan
