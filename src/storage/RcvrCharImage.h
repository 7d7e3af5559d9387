#pragma once

// A receiver's characterization as the analyzer stores it: unsigned 16-bit words, an
// 11-word header and one 28-word record per frequency. Multi-byte values are split into
// words low word first, and words are written low byte first, whatever the host's order.

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace storage {

// One compression level of a record.
struct CompressionPoint {
    float power = 0;  // receiver reading at the compression point, dBm
    float value = 0;  // compression, dB
    float phase = 0;  // degrees

    friend bool operator==(const CompressionPoint&, const CompressionPoint&) = default;
};

inline constexpr std::size_t kCompressionLevels = 4;
using RecordPoints = std::array<CompressionPoint, kCompressionLevels>;

// How much of a stored image a reader can trust.
enum class ImageCompleteness {
    NoHeader,        // fewer words than a header
    BadLevelCount,   // the header announces more levels than a record holds
    MissingRecords,  // fewer complete records than the header announces
    Complete,
};

class RcvrCharImage {
  public:
    static constexpr std::size_t kHeaderWords = 11;
    static constexpr std::size_t kRecordWords = 28;

    RcvrCharImage() = default;
    explicit RcvrCharImage(std::vector<std::uint16_t> words);

    // A fresh image holding only its header, with room reserved for every announced record.
    static RcvrCharImage withHeader(std::string_view receiverName, std::uint32_t recordCount,
                                    float narrowbandLoss, float attenuatorDb);

    void appendRecord(double frequencyHz, const RecordPoints& points);
    // A frequency whose twelve values are all zero.
    void appendZeroRecord(double frequencyHz);
    // Corrects the header's record count; the records themselves are untouched.
    void setAnnouncedRecords(std::uint32_t count);
    // Keeps the record's frequency and zeroes its twelve values (a defaulted characterization).
    void zeroRecordPoints(std::size_t record);

    // Header readers; each raises an error text when the image is shorter than a header.
    std::uint16_t formatWord() const;
    std::uint32_t announcedRecords() const;
    std::uint16_t levelCount() const;
    // The stored name characters up to the first zero byte.
    std::string nameCharacters() const;
    float referenceConstant() const;
    float narrowbandLoss() const;
    float attenuatorDb() const;

    // Complete 28-word records that follow the header.
    std::size_t recordsPresent() const;
    // Record readers; a record beyond recordsPresent() raises an error text.
    double frequency(std::size_t record) const;
    CompressionPoint point(std::size_t record, std::size_t level) const;

    ImageCompleteness completeness() const;
    // Empty for a complete image; otherwise what is wrong with it, in words.
    std::string defect() const;

    const std::vector<std::uint16_t>& words() const { return m_words; }
    std::size_t wordCount() const { return m_words.size(); }
    // The bytes of a data file: every word low byte first.
    std::string bytes() const;

    // Reads a data file's bytes as consecutive words; a trailing odd byte is not a word.
    static RcvrCharImage fromBytes(std::string_view bytes);
    // Reads a "DIAG:flasharray?" reply: the first character is dropped, the rest is split at
    // every comma and each piece read as an integer (leading blanks and sign, then digits;
    // no digits give 0), of which the low 16 bits are kept.
    static RcvrCharImage fromFlashReply(std::string_view reply);

    friend bool operator==(const RcvrCharImage&, const RcvrCharImage&) = default;

  private:
    std::uint32_t uint32At(std::size_t index) const;
    float floatAt(std::size_t index) const;
    void requireHeader() const;
    std::size_t recordStart(std::size_t record) const;
    void appendWord(std::uint16_t word) { m_words.push_back(word); }
    void appendUint32(std::uint32_t value);
    void appendFloat(float value);
    void appendDouble(double value);

    std::vector<std::uint16_t> m_words;
};

}  // namespace storage
