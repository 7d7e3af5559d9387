#include "storage/RcvrCharImage.h"

#include <algorithm>
#include <bit>

namespace storage {
namespace {

constexpr std::uint16_t kFormatWord = 1;
constexpr float kReferenceConstant = 25.0f;
// Word offsets inside the header.
constexpr std::size_t kCountWord = 1;
constexpr std::size_t kLevelWord = 3;
constexpr std::size_t kNameWord = 4;
constexpr std::size_t kConstantWord = 5;
constexpr std::size_t kLossWord = 7;
constexpr std::size_t kAttenuatorWord = 9;
// Word offsets inside a record: the frequency, then three floats per level.
constexpr std::size_t kFirstPointWord = 4;
constexpr std::size_t kPointWords = 6;

}  // namespace

RcvrCharImage::RcvrCharImage(std::vector<std::uint16_t> words) : m_words(std::move(words)) {}

RcvrCharImage RcvrCharImage::withHeader(std::string_view receiverName, std::uint32_t recordCount,
                                        float narrowbandLoss, float attenuatorDb) {
    RcvrCharImage image;
    image.m_words.reserve(kHeaderWords + kRecordWords * static_cast<std::size_t>(recordCount));
    image.appendWord(kFormatWord);
    image.appendUint32(recordCount);
    image.appendWord(static_cast<std::uint16_t>(kCompressionLevels));
    std::uint16_t name = 0;
    if (!receiverName.empty()) {
        name = static_cast<unsigned char>(receiverName[0]);
    }
    if (receiverName.size() > 1) {
        name |= static_cast<std::uint16_t>(static_cast<unsigned char>(receiverName[1]) << 8);
    }
    image.appendWord(name);
    image.appendFloat(kReferenceConstant);
    image.appendFloat(narrowbandLoss);
    image.appendFloat(attenuatorDb);
    return image;
}

void RcvrCharImage::appendRecord(double frequencyHz, const RecordPoints& points) {
    appendDouble(frequencyHz);
    for (const auto& p : points) {
        appendFloat(p.power);
        appendFloat(p.value);
        appendFloat(p.phase);
    }
}

void RcvrCharImage::appendZeroRecord(double frequencyHz) {
    appendRecord(frequencyHz, RecordPoints{});
}

void RcvrCharImage::setAnnouncedRecords(std::uint32_t count) {
    requireHeader();
    m_words[kCountWord] = static_cast<std::uint16_t>(count & 0xFFFFu);
    m_words[kCountWord + 1] = static_cast<std::uint16_t>(count >> 16);
}

void RcvrCharImage::zeroRecordPoints(std::size_t record) {
    std::size_t start = recordStart(record) + kFirstPointWord;
    std::fill(m_words.begin() + static_cast<std::ptrdiff_t>(start),
              m_words.begin() + static_cast<std::ptrdiff_t>(start + kRecordWords - kFirstPointWord),
              std::uint16_t{0});
}

std::uint16_t RcvrCharImage::formatWord() const {
    requireHeader();
    return m_words[0];
}

std::uint32_t RcvrCharImage::announcedRecords() const {
    requireHeader();
    return uint32At(kCountWord);
}

std::uint16_t RcvrCharImage::levelCount() const {
    requireHeader();
    return m_words[kLevelWord];
}

std::string RcvrCharImage::nameCharacters() const {
    requireHeader();
    std::string name;
    for (unsigned shift : {0u, 8u}) {
        char c = static_cast<char>((m_words[kNameWord] >> shift) & 0xFFu);
        if (c == '\0') {
            break;
        }
        name += c;
    }
    return name;
}

float RcvrCharImage::referenceConstant() const {
    requireHeader();
    return floatAt(kConstantWord);
}

float RcvrCharImage::narrowbandLoss() const {
    requireHeader();
    return floatAt(kLossWord);
}

float RcvrCharImage::attenuatorDb() const {
    requireHeader();
    return floatAt(kAttenuatorWord);
}

std::size_t RcvrCharImage::recordsPresent() const {
    if (m_words.size() < kHeaderWords) {
        return 0;
    }
    return (m_words.size() - kHeaderWords) / kRecordWords;
}

double RcvrCharImage::frequency(std::size_t record) const {
    std::size_t start = recordStart(record);
    std::uint64_t bits = 0;
    for (std::size_t i = 0; i < 4; ++i) {
        bits |= static_cast<std::uint64_t>(m_words[start + i]) << (16 * i);
    }
    return std::bit_cast<double>(bits);
}

CompressionPoint RcvrCharImage::point(std::size_t record, std::size_t level) const {
    if (level >= kCompressionLevels) {
        throw std::string("Compression level " + std::to_string(level) +
                          " does not exist; a record holds levels 0 to " +
                          std::to_string(kCompressionLevels - 1));
    }
    std::size_t start = recordStart(record) + kFirstPointWord + level * kPointWords;
    return {floatAt(start), floatAt(start + 2), floatAt(start + 4)};
}

ImageCompleteness RcvrCharImage::completeness() const {
    if (m_words.size() < kHeaderWords) {
        return ImageCompleteness::NoHeader;
    }
    if (m_words[kLevelWord] > kCompressionLevels) {
        return ImageCompleteness::BadLevelCount;
    }
    if (recordsPresent() < announcedRecords()) {
        return ImageCompleteness::MissingRecords;
    }
    return ImageCompleteness::Complete;
}

std::string RcvrCharImage::defect() const {
    switch (completeness()) {
        case ImageCompleteness::NoHeader:
            return "the image holds " + std::to_string(m_words.size()) + " words, fewer than the " +
                   std::to_string(kHeaderWords) + " of its header";
        case ImageCompleteness::BadLevelCount:
            return "the header announces " + std::to_string(m_words[kLevelWord]) +
                   " compression levels, more than the " + std::to_string(kCompressionLevels) +
                   " a record holds";
        case ImageCompleteness::MissingRecords:
            return "the header announces " + std::to_string(announcedRecords()) +
                   " records but the image holds " + std::to_string(recordsPresent()) +
                   " complete records (" + std::to_string(m_words.size()) + " words)";
        case ImageCompleteness::Complete:
            break;
    }
    return {};
}

std::string RcvrCharImage::bytes() const {
    std::string out(m_words.size() * 2, '\0');
    for (std::size_t i = 0; i < m_words.size(); ++i) {
        out[2 * i] = static_cast<char>(m_words[i] & 0xFFu);
        out[2 * i + 1] = static_cast<char>(m_words[i] >> 8);
    }
    return out;
}

RcvrCharImage RcvrCharImage::fromBytes(std::string_view bytes) {
    std::vector<std::uint16_t> words(bytes.size() / 2);
    for (std::size_t i = 0; i < words.size(); ++i) {
        words[i] = static_cast<std::uint16_t>(static_cast<unsigned char>(bytes[2 * i]) |
                                              (static_cast<unsigned char>(bytes[2 * i + 1]) << 8));
    }
    return RcvrCharImage(std::move(words));
}

RcvrCharImage RcvrCharImage::fromFlashReply(std::string_view reply) {
    std::vector<std::uint16_t> words;
    std::string_view rest = reply.empty() ? reply : reply.substr(1);
    words.reserve(static_cast<std::size_t>(std::count(rest.begin(), rest.end(), ',')) + 1);
    std::size_t pos = 0;
    for (;;) {
        std::size_t comma = rest.find(',', pos);
        std::string_view piece =
            rest.substr(pos, comma == std::string_view::npos ? rest.npos : comma - pos);
        std::size_t i = 0;
        while (i < piece.size() && (piece[i] == ' ' || (piece[i] >= '\t' && piece[i] <= '\r'))) {
            ++i;
        }
        bool negative = false;
        if (i < piece.size() && (piece[i] == '+' || piece[i] == '-')) {
            negative = piece[i] == '-';
            ++i;
        }
        // Only the low 16 bits are kept, so the value can be accumulated modulo 2^16.
        std::uint16_t value = 0;
        for (; i < piece.size() && piece[i] >= '0' && piece[i] <= '9'; ++i) {
            value = static_cast<std::uint16_t>(value * 10u + static_cast<unsigned>(piece[i] - '0'));
        }
        words.push_back(negative ? static_cast<std::uint16_t>(0u - value) : value);
        if (comma == std::string_view::npos) {
            break;
        }
        pos = comma + 1;
    }
    return RcvrCharImage(std::move(words));
}

std::uint32_t RcvrCharImage::uint32At(std::size_t index) const {
    return static_cast<std::uint32_t>(m_words[index]) |
           (static_cast<std::uint32_t>(m_words[index + 1]) << 16);
}

float RcvrCharImage::floatAt(std::size_t index) const {
    return std::bit_cast<float>(uint32At(index));
}

void RcvrCharImage::requireHeader() const {
    if (m_words.size() < kHeaderWords) {
        throw std::string("Characterization image too short: " + defect());
    }
}

std::size_t RcvrCharImage::recordStart(std::size_t record) const {
    if (record >= recordsPresent()) {
        throw std::string("Characterization record " + std::to_string(record) +
                          " is not in the image, which holds " + std::to_string(recordsPresent()) +
                          " complete records");
    }
    return kHeaderWords + record * kRecordWords;
}

void RcvrCharImage::appendUint32(std::uint32_t value) {
    appendWord(static_cast<std::uint16_t>(value & 0xFFFFu));
    appendWord(static_cast<std::uint16_t>(value >> 16));
}

void RcvrCharImage::appendFloat(float value) {
    appendUint32(std::bit_cast<std::uint32_t>(value));
}

void RcvrCharImage::appendDouble(double value) {
    auto bits = std::bit_cast<std::uint64_t>(value);
    for (int i = 0; i < 4; ++i) {
        appendWord(static_cast<std::uint16_t>((bits >> (16 * i)) & 0xFFFFu));
    }
}

}  // namespace storage
