// Flash catalog and flash array write with the follow-up pokes.

#include <charconv>

#include "analyzer/NetworkAnalyzerClass.h"

namespace {

// ", " and at most five digits per word.
constexpr std::size_t maxCharsPerWord = 7;

}  // namespace

std::string CNetworkAnalyzer::flashcatalog() {
    return sendscpi("DIAG:FLASH:CAT?");
}

std::string CNetworkAnalyzer::flasharray(const std::string& fileName, const std::string& calName,
                                         std::span<const std::uint16_t> image) {
    std::string command = "DIAG:FLASHARRAY \"" + fileName + "\",\"" + calName + "\"";
    const std::size_t prefix = command.size();
    // Rendered in place: images run to millions of words, so no per-word allocation.
    command.resize(prefix + maxCharsPerWord * image.size());
    char* out = command.data() + prefix;
    char* const end = command.data() + command.size();
    for (const std::uint16_t word : image) {
        *out++ = ',';
        *out++ = ' ';
        out = std::to_chars(out, end, word).ptr;
    }
    command.resize(static_cast<std::size_t>(out - command.data()));

    std::string reply = sendscpi(std::move(command));
    sendscpi("DIAG:POKE 9,4");
    sendscpi("DIAG:POKE 9,3");
    sendscpi("DIAG:EEUPDATEHW");
    return reply;
}
