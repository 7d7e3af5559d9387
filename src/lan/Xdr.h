#pragma once

// XDR, the byte layout of ONC RPC arguments and results: big-endian 32-bit words, and
// variable-length opaque data or strings as a length word followed by the bytes padded to
// a multiple of four.

#include <cstdint>
#include <string>
#include <string_view>

#include "lan/ProtocolError.h"

namespace lan {

class XdrWriter {
  public:
    explicit XdrWriter(std::string& out) : m_out(out) {}
    void u32(std::uint32_t value);
    void i32(std::int32_t value) { u32(static_cast<std::uint32_t>(value)); }
    void boolean(bool value) { u32(value ? 1 : 0); }
    void opaque(std::string_view bytes);

  private:
    std::string& m_out;
};

// Reads from a view; every read checks the remaining length, so a lying length field never
// reads past the record, throwing ProtocolError, or sizes an allocation.
class XdrReader {
  public:
    explicit XdrReader(std::string_view bytes) : m_bytes(bytes) {}
    // The reader keeps a view: a temporary string would leave it dangling.
    explicit XdrReader(std::string&&) = delete;
    std::uint32_t u32(const char* what);
    std::int32_t i32(const char* what) { return static_cast<std::int32_t>(u32(what)); }
    bool boolean(const char* what);
    // A view into the record; `maxBytes` is the field's declared bound.
    std::string_view opaque(const char* what, std::size_t maxBytes = SIZE_MAX);
    std::size_t remaining() const { return m_bytes.size() - m_pos; }

  private:
    std::string_view m_bytes;
    std::size_t m_pos = 0;
};

}  // namespace lan
