#include "storage/FlashCatalog.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "config/Split.h"
#include "platform/UpperCase.h"
#include "storage/CatalogAge.h"
#include "storage/PortDataFile.h"
#include "storage/ReceiverNames.h"
#include "storage/StoredImage.h"

namespace storage {
namespace {

constexpr char kGrouping = '&';
constexpr std::size_t kLongestListingLine = 149;
constexpr const char* kListingFile = "fileInfo.txt";

// The catalog reply and the listing lines are cut with "&" as the grouping character.
std::vector<std::string> splitTokens(const std::string& text, char delimiter) {
    std::vector<std::string> tokens;
    Split(text, tokens, std::string(1, delimiter), kGrouping);
    return tokens;
}

// The receiver whose catalog name occurs in the calibration name; the last one in list order.
const std::string* matchReceiver(const std::string& calibration,
                                 const std::vector<std::string>& receivers) {
    const std::string* match = nullptr;
    for (const auto& receiver : receivers) {
        const std::string key =
            isLowFrequencyExtension(receiver) ? shortReceiverName(receiver) : receiver;
        if (calibration.find(key) != std::string::npos) {
            match = &receiver;
        }
    }
    return match;
}

// The listing line that names the file: reading stops there, at the end, or at an overlong
// line.
std::string listingLineFor(std::istream& listing, const std::string& fileName) {
    std::string line;
    while (std::getline(listing, line)) {
        if (!line.empty() && line.back() == '\r') {
            line.pop_back();
        }
        if (line.size() > kLongestListingLine) {
            break;
        }
        if (line.find(fileName) != std::string::npos) {
            return line;
        }
    }
    return {};
}

}  // namespace

void applyCatalogReply(const std::string& reply, const std::vector<std::string>& receivers,
                       CatalogFindings& findings, std::chrono::system_clock::time_point now) {
    for (const auto& line : splitTokens(reply, '\n')) {
        auto fields = splitTokens(line, ' ');
        if (fields.size() < 4 || fields[3].find("RCVRCHAR") == std::string::npos) {
            continue;
        }
        std::size_t backslash = fields[3].find('\\');
        std::string calibration =
            backslash == std::string::npos ? fields[3] : fields[3].substr(backslash + 1);
        const std::string* receiver = matchReceiver(calibration, receivers);
        if (receiver == nullptr) {
            continue;
        }
        if (int state = catalogAge(fields[0], now); state != kCatalogNothing) {
            findings[*receiver] = state;
        }
    }
}

int listingState(std::istream& listing, const std::string& fileName,
                 std::chrono::system_clock::time_point now) {
    auto fields = splitTokens(listingLineFor(listing, fileName), ' ');
    if (fields.size() < 4 || std::strtod(fields[3].c_str(), nullptr) == 0) {
        return kCatalogNothing;
    }
    return catalogAge(fields[0], now);
}

std::optional<CatalogEntry> catalogEntry(const StorageContext& context,
                                         platform::ProcessRunner& processes,
                                         const std::string& receiver) {
    CatalogEntry entry;
    if (!context.analyzer.ismmwave()) {
        const std::string wanted = "RCVRCHAR\\" + platform::upperCased(flashName(receiver));
        for (const auto& line : splitTokens(context.analyzer.flashcatalog(), '\n')) {
            auto fields = splitTokens(line, ' ');
            if (fields.size() >= 4 && platform::upperCased(fields[3]) == wanted) {
                entry.date = fields[0] + " " + fields[1];
                entry.bytes = std::strtoull(fields[2].c_str(), nullptr, 10);
                return entry.bytes == 0 ? std::nullopt : std::optional(entry);
            }
        }
        return std::nullopt;
    }
    auto file = findPortDataFile(context.analyzer.readmodel(false), receiver);
    if (!file) {
        return std::nullopt;
    }
    const auto listingPath = context.paths.toLocal(kListingFile);
    std::error_code ignored;
    std::filesystem::remove(listingPath, ignored);
    processes.runCommand("dir /-C \"" + file->path + "\" > " + kListingFile);
    std::ifstream listing(listingPath, std::ios::binary);
    auto fields = splitTokens(listingLineFor(listing, file->fileName), ' ');
    if (fields.size() < 4) {
        return std::nullopt;
    }
    entry.date = fields[0] + " " + fields[1] + " " + fields[2];
    entry.bytes = std::strtoull(fields[3].c_str(), nullptr, 10);
    return entry.bytes == 0 ? std::nullopt : std::optional(entry);
}

void catalogFlash(const StorageContext& context, platform::ProcessRunner& processes,
                  const std::vector<std::string>& receivers, CatalogFindings& findings,
                  std::chrono::system_clock::time_point now) {
    for (const auto& receiver : receivers) {
        findings.emplace(receiver, kCatalogNothing);
    }
    if (!context.analyzer.ismmwave()) {
        applyCatalogReply(context.analyzer.flashcatalog(), receivers, findings, now);
        return;
    }
    const std::string model = context.analyzer.readmodel(false);
    const auto listingPath = context.paths.toLocal(kListingFile);
    for (const auto& receiver : receivers) {
        auto file = findPortDataFile(model, receiver);
        if (!file) {
            continue;
        }
        // A listing left from the previous receiver must not stand in for this one's.
        std::error_code ignored;
        std::filesystem::remove(listingPath, ignored);
        processes.runCommand("dir /-C \"" + file->path + "\" > " + kListingFile);
        std::ifstream listing(listingPath, std::ios::binary);
        if (int state = listingState(listing, file->fileName, now); state != kCatalogNothing) {
            findings[receiver] = state;
        }
    }
}

}  // namespace storage
