#pragma once

// ONC RPC record marking on a TCP stream: a record is one or more fragments, each led by a
// 4-byte big-endian word whose top bit marks the last fragment and whose low 31 bits give
// the fragment's length.

#include <cstddef>
#include <string>
#include <string_view>

namespace lan {

// Reassembles records from stream bytes. The buffer grows only as bytes arrive and never
// beyond `maxRecordBytes`; an announced total above it throws ProtocolError before anything
// is stored.
class RecordReader {
  public:
    explicit RecordReader(std::size_t maxRecordBytes) : m_maxRecordBytes(maxRecordBytes) {}
    // Takes bytes up to the end of the next complete record; returns how many it took.
    std::size_t feed(std::string_view bytes);
    bool complete() const { return m_complete; }
    std::string_view record() const { return m_record; }
    // Forgets the completed record so that the next one can be read.
    void next();

  private:
    std::size_t m_maxRecordBytes;
    std::string m_record;
    char m_header[4] = {};
    std::size_t m_headerBytes = 0;
    std::size_t m_fragmentLeft = 0;
    bool m_lastFragment = false;
    bool m_complete = false;
};

// A record under construction: four bytes kept for the mark, then the payload.
std::string beginRecord();
// Writes the mark of a single-fragment record over the four reserved bytes.
void finishRecord(std::string& record);

}  // namespace lan
