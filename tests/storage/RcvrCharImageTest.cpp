#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <functional>
#include <iomanip>
#include <sstream>

#include "ErrorOf.h"
#include "platform/ErrorText.h"
#include "storage/ExportText.h"
#include "storage/RcvrCharImage.h"

using storage::CompressionPoint;
using storage::ImageCompleteness;
using storage::RcvrCharImage;
using storage::RecordPoints;

namespace {

using testsupport::errorOf;

RecordPoints samplePoints() {
    return {{{-10.5f, -0.05f, -0.15f},
             {-9.25f, -0.1f, -0.3f},
             {-8.0f, -0.2f, -0.6f},
             {-6.5f, -0.5f, -1.5f}}};
}

// Two records: a low frequency with zeros and a measured one.
RcvrCharImage sampleImage() {
    auto image = RcvrCharImage::withHeader("R1", 2, -3.25f, 30.0f);
    image.appendZeroRecord(10e6);
    image.appendRecord(1.5e9, samplePoints());
    return image;
}

std::string hex(const std::string& bytes, std::size_t from, std::size_t count) {
    std::string out;
    char buffer[4];
    for (std::size_t i = from; i < from + count; ++i) {
        std::snprintf(buffer, sizeof buffer, "%02X", static_cast<unsigned char>(bytes[i]));
        out += (out.empty() ? "" : " ") + std::string(buffer);
    }
    return out;
}

}  // namespace

TEST(RcvrCharImageLayout, HeaderBytesAreLittleEndianWordsLowWordFirst) {
    auto image = RcvrCharImage::withHeader("A", 70000, 1.0f, 30.0f);
    std::string bytes = image.bytes();
    ASSERT_EQ(bytes.size(), 22u);
    // Format 1; 70000 = 0x00011170 records, low word first; 4 levels; a one-character name:
    // the character, then a zero byte; the floats 25.0, 1.0 and 30.0.
    EXPECT_EQ(hex(bytes, 0, 22),
              "01 00 70 11 01 00 04 00 41 00 00 00 C8 41 00 00 80 3F 00 00 F0 41");
    EXPECT_EQ(image.referenceConstant(), 25.0f);
}

TEST(RcvrCharImageLayout, TwoCharacterNameAndRecordsOf56Bytes) {
    auto image = sampleImage();
    std::string bytes = image.bytes();
    ASSERT_EQ(bytes.size(), 22u + 56u * 2u);
    EXPECT_EQ(hex(bytes, 8, 2), "52 31");  // "R1", first character in the low byte
    // 10 MHz as a double: 0x416312D000000000, low word first.
    EXPECT_EQ(hex(bytes, 22, 8), "00 00 00 00 D0 12 63 41");
    EXPECT_EQ(bytes.substr(30, 48), std::string(48, '\0'));
    // The measured record's first float, -10.5 = 0xC1280000.
    EXPECT_EQ(hex(bytes, 22 + 56 + 8, 4), "00 00 28 C1");
    EXPECT_EQ(RcvrCharImage::withHeader("", 0, 0, 0).nameCharacters(), "");
    EXPECT_EQ(RcvrCharImage::withHeader("R1_LFE", 0, 0, 0).nameCharacters(), "R1");
}

TEST(RcvrCharImageLayout, BytesRoundTripAndOddTrailingByteIsNoWord) {
    auto image = sampleImage();
    EXPECT_EQ(RcvrCharImage::fromBytes(image.bytes()), image);
    EXPECT_EQ(RcvrCharImage::fromBytes(image.bytes() + "x"), image);
    EXPECT_EQ(RcvrCharImage::fromBytes("").wordCount(), 0u);
}

TEST(RcvrCharImageEditing, DefaultingZeroesValuesButKeepsFrequencyAndCountCanBeCorrected) {
    auto image = sampleImage();
    image.zeroRecordPoints(1);
    EXPECT_EQ(image.frequency(1), 1.5e9);
    for (std::size_t level = 0; level < 4; ++level) {
        EXPECT_EQ(image.point(1, level), CompressionPoint{});
    }
    EXPECT_EQ(image.wordCount(), 11u + 56u);
    image.setAnnouncedRecords(0x12345);
    EXPECT_EQ(image.announcedRecords(), 0x12345u);
    EXPECT_EQ(image.words()[1], 0x2345);
    EXPECT_EQ(image.words()[2], 0x0001);
}

TEST(RcvrCharImageReaders, ShortImagesSaySoInsteadOfReadingPastTheEnd) {
    RcvrCharImage tooShort(std::vector<std::uint16_t>(7, 1));
    EXPECT_EQ(tooShort.completeness(), ImageCompleteness::NoHeader);
    EXPECT_EQ(errorOf([&] { tooShort.announcedRecords(); }),
              "Characterization image too short: the image holds 7 words, fewer than the 11 of "
              "its header");
    EXPECT_EQ(tooShort.recordsPresent(), 0u);

    auto words = sampleImage().words();
    words.pop_back();
    RcvrCharImage truncated(words);
    EXPECT_EQ(truncated.completeness(), ImageCompleteness::MissingRecords);
    EXPECT_EQ(truncated.recordsPresent(), 1u);
    EXPECT_EQ(truncated.defect(),
              "the header announces 2 records but the image holds 1 complete records (66 words)");
    EXPECT_EQ(errorOf([&] { truncated.frequency(1); }),
              "Characterization record 1 is not in the image, which holds 1 complete records");
    EXPECT_EQ(errorOf([&] { truncated.point(0, 4); }),
              "Compression level 4 does not exist; a record holds levels 0 to 3");

    words = sampleImage().words();
    words[3] = 5;
    RcvrCharImage tooManyLevels(words);
    EXPECT_EQ(tooManyLevels.completeness(), ImageCompleteness::BadLevelCount);
    EXPECT_EQ(tooManyLevels.defect(),
              "the header announces 5 compression levels, more than the 4 a record holds");
    EXPECT_EQ(sampleImage().completeness(), ImageCompleteness::Complete);
    EXPECT_EQ(sampleImage().defect(), "");
}

TEST(RcvrCharImageReaders, FlashReplySkipsFirstCharacterAndKeepsLow16Bits) {
    EXPECT_EQ(RcvrCharImage::fromFlashReply(",1,2,4").words(),
              (std::vector<std::uint16_t>{1, 2, 4}));
    // A reply that starts with a digit loses that digit.
    EXPECT_EQ(RcvrCharImage::fromFlashReply("12,3").words(), (std::vector<std::uint16_t>{2, 3}));
    EXPECT_EQ(RcvrCharImage::fromFlashReply(",  +7x9, -1,65535,65537,,abc").words(),
              (std::vector<std::uint16_t>{7, 65535, 65535, 1, 0, 0}));
    // An empty reply is one empty field: one word, far from a header.
    EXPECT_EQ(RcvrCharImage::fromFlashReply("").words(), (std::vector<std::uint16_t>{0}));
    EXPECT_EQ(RcvrCharImage::fromFlashReply(",").words(), (std::vector<std::uint16_t>{0}));

    auto image = sampleImage();
    std::string reply;
    for (auto w : image.words()) {
        reply += ", " + std::to_string(w);
    }
    EXPECT_EQ(RcvrCharImage::fromFlashReply(reply), image);
}

TEST(RcvrCharImagePerformance, HundredThousandRecordsBuildAndParseInLinearTime) {
    constexpr std::uint32_t records = 100000;
    auto start = std::chrono::steady_clock::now();
    auto image = RcvrCharImage::withHeader("B", records, 0, 0);
    for (std::uint32_t i = 0; i < records; ++i) {
        image.appendRecord(1e7 + i, samplePoints());
    }
    std::string reply = ",";
    for (auto w : image.words()) {
        reply += std::to_string(w) + ",";
    }
    reply.pop_back();
    auto parsed = RcvrCharImage::fromFlashReply(reply);
    auto elapsed = std::chrono::steady_clock::now() - start;
    EXPECT_EQ(image.wordCount(), 11u + 28u * records);
    EXPECT_EQ(parsed, image);
    EXPECT_EQ(image.completeness(), ImageCompleteness::Complete);
    // Generous even for sanitizer builds; a quadratic step would take minutes.
    EXPECT_LT(elapsed, std::chrono::seconds(20));
}

TEST(ExportText, WritesHeaderAndOneLinePerRecordWithoutFinalLineBreak) {
    auto image = RcvrCharImage::withHeader("R1", 2, -3.25f, 29.6f);
    image.appendZeroRecord(10e6);
    image.appendRecord(26500000000.0, samplePoints());
    std::ostringstream out;
    EXPECT_TRUE(storage::writeExportText(out, image));
    EXPECT_EQ(out.str(),
              "1\nR1\n25\n-3.25\n30\n"
              "10000000, (0,0,0), (0,0,0), (0,0,0), (0,0,0)\n"
              "26500000000, (-10.5,-0.050000001,-0.15000001), (-9.25,-0.1,-0.30000001), "
              "(-8,-0.2,-0.60000002), (-6.5,-0.5,-1.5)");
}

TEST(ExportText, HeaderNumbersUseTwelveDigitsAndAttenuatorHasNoSign) {
    auto image = RcvrCharImage::withHeader("A", 0, 0.1f, -10.4f);
    std::ostringstream out;
    out << std::fixed << std::setprecision(2);
    EXPECT_TRUE(storage::writeExportText(out, image));
    EXPECT_EQ(out.str(), "1\nA\n25\n0.10000000149\n10");
    // The caller's stream settings are restored.
    EXPECT_EQ(out.precision(), 2);
    EXPECT_TRUE(out.flags() & std::ios::fixed);
}

TEST(ExportText, LevelCountSetsTriplesAndIncompleteImagesGiveHeaderOnly) {
    auto words = sampleImage().words();
    words[3] = 2;
    std::ostringstream two;
    EXPECT_TRUE(storage::writeExportText(two, RcvrCharImage(words)));
    EXPECT_EQ(two.str().substr(two.str().rfind('\n') + 1),
              "1500000000, (-10.5,-0.050000001,-0.15000001), (-9.25,-0.1,-0.30000001)");

    // A missing last word and nine levels per record.
    for (bool truncate : {true, false}) {
        words = sampleImage().words();
        truncate ? words.pop_back() : void(words[3] = 9);
        std::ostringstream out;
        EXPECT_FALSE(storage::writeExportText(out, RcvrCharImage(words))) << truncate;
        EXPECT_EQ(out.str(), "1\nR1\n25\n-3.25\n30") << truncate;
    }
}
