// Flash catalog and flash array write with the follow-up pokes.

#include <algorithm>
#include <array>
#include <charconv>
#include <cstring>

#include "analyzer/NetworkAnalyzerClass.h"

namespace {

// ", " and at most five digits per word.
constexpr std::size_t maxCharsPerWord = 7;

// Images run to millions of words: every 16-bit word is rendered once, ahead of time, and
// a write is then one 8-byte copy per word.
struct RenderedWord {
    char text[maxCharsPerWord];
    std::uint8_t length;
};
static_assert(sizeof(RenderedWord) == 8);

struct RenderedWords {
    RenderedWords() {
        for (std::size_t value = 0; value < words.size(); ++value) {
            RenderedWord& word = words[value];
            word.text[0] = ',';
            word.text[1] = ' ';
            char* end = std::to_chars(word.text + 2, word.text + maxCharsPerWord,
                                      static_cast<std::uint16_t>(value))
                            .ptr;
            std::fill(end, word.text + maxCharsPerWord, ' ');
            word.length = static_cast<std::uint8_t>(end - word.text);
        }
    }
    std::array<RenderedWord, 65536> words;
};

const RenderedWords& renderedWords() {
    static const RenderedWords table;
    return table;
}

// Appends ", " and the decimal number of every word.
void appendWords(std::string& out, std::span<const std::uint16_t> image) {
    constexpr std::size_t chunkWords = 1024;
    // Rendered through a small buffer that stays in cache, then appended in one copy.
    char chunk[chunkWords * maxCharsPerWord + sizeof(RenderedWord)];
    const auto& words = renderedWords().words;
    for (std::size_t begin = 0; begin < image.size(); begin += chunkWords) {
        const std::size_t end = std::min(image.size(), begin + chunkWords);
        char* cursor = chunk;
        for (std::size_t i = begin; i < end; ++i) {
            const RenderedWord& word = words[image[i]];
            // The whole entry is copied; only its length counts, the rest is overwritten.
            std::memcpy(cursor, &word, sizeof word);
            cursor += word.length;
        }
        out.append(chunk, cursor);
    }
}

}  // namespace

std::string CNetworkAnalyzer::flashcatalog() {
    return sendscpi("DIAG:FLASH:CAT?");
}

std::string CNetworkAnalyzer::flasharray(const std::string& fileName, const std::string& calName,
                                         std::span<const std::uint16_t> image) {
    std::string command;
    command.reserve(fileName.size() + calName.size() + 24 + maxCharsPerWord * image.size());
    command += "DIAG:FLASHARRAY \"";
    command += fileName;
    command += "\",\"";
    command += calName;
    command += "\"";
    appendWords(command, image);

    std::string reply = sendscpi(std::move(command));
    sendscpi("DIAG:POKE 9,4");
    sendscpi("DIAG:POKE 9,3");
    sendscpi("DIAG:EEUPDATEHW");
    return reply;
}
