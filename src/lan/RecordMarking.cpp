#include "lan/RecordMarking.h"

#include <algorithm>
#include <cstdint>

#include "lan/ProtocolError.h"

namespace lan {

namespace {

constexpr std::uint32_t lastFragmentBit = 0x80000000u;
constexpr std::size_t retainedBytes = 1u << 20;

}  // namespace

std::size_t RecordReader::feed(std::string_view bytes) {
    std::size_t used = 0;
    while (!m_complete && used < bytes.size()) {
        if (m_headerBytes < 4) {
            m_header[m_headerBytes++] = bytes[used++];
            if (m_headerBytes < 4) {
                continue;
            }
            const auto* h = reinterpret_cast<const unsigned char*>(m_header);
            const std::uint32_t word = (std::uint32_t{h[0]} << 24) | (std::uint32_t{h[1]} << 16) |
                                       (std::uint32_t{h[2]} << 8) | std::uint32_t{h[3]};
            m_lastFragment = (word & lastFragmentBit) != 0;
            m_fragmentLeft = word & ~lastFragmentBit;
            if (m_fragmentLeft > m_maxRecordBytes - m_record.size()) {
                throw ProtocolError(
                    "RPC record of more than " + std::to_string(m_record.size() + m_fragmentLeft) +
                    " bytes exceeds the limit of " + std::to_string(m_maxRecordBytes));
            }
        }
        const std::size_t take = std::min(m_fragmentLeft, bytes.size() - used);
        m_record.append(bytes.substr(used, take));
        used += take;
        m_fragmentLeft -= take;
        if (m_fragmentLeft == 0) {
            m_headerBytes = 0;
            m_complete = m_lastFragment;
        }
    }
    return used;
}

void RecordReader::next() {
    // A connection that once sent a large write should not keep that much memory.
    if (m_record.capacity() > retainedBytes) {
        std::string().swap(m_record);
    }
    m_record.clear();
    m_complete = false;
}

std::string beginRecord() {
    return std::string(4, '\0');
}

void finishRecord(std::string& record) {
    const std::uint32_t word = lastFragmentBit | static_cast<std::uint32_t>(record.size() - 4);
    record[0] = static_cast<char>(word >> 24);
    record[1] = static_cast<char>(word >> 16);
    record[2] = static_cast<char>(word >> 8);
    record[3] = static_cast<char>(word);
}

}  // namespace lan
