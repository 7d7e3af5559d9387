#include "storage/FlashCatalog.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "storage/CatalogAge.h"
#include "storage/PortDataFile.h"
#include "storage/ReceiverNames.h"

namespace storage {
namespace {

constexpr char kGrouping = '&';
constexpr std::size_t kLongestListingLine = 149;
constexpr const char* kListingFile = "fileInfo.txt";

// Tokens between runs of the delimiter; a token that starts with the grouping character runs
// to the next one (both left out), and one without a closing partner is dropped.
std::vector<std::string> splitTokens(const std::string& text, char delimiter) {
    std::vector<std::string> tokens;
    std::size_t pos = 0;
    while (pos < text.size()) {
        if (text[pos] == delimiter) {
            ++pos;
            continue;
        }
        if (text[pos] == kGrouping) {
            std::size_t close = text.find(kGrouping, pos + 1);
            if (close == std::string::npos) {
                ++pos;
                continue;
            }
            tokens.push_back(text.substr(pos + 1, close - pos - 1));
            pos = close + 1;
            continue;
        }
        std::size_t end = text.find(delimiter, pos);
        if (end == std::string::npos) {
            end = text.size();
        }
        tokens.push_back(text.substr(pos, end - pos));
        pos = end;
    }
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

void readFlashCatalog(const StorageContext& context, const std::vector<std::string>& receivers,
                      CatalogFindings& findings, std::chrono::system_clock::time_point now) {
    for (const auto& line : splitTokens(context.analyzer.flashcatalog(), '\n')) {
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

// The listing line that names the file: reading stops there, at the end, or at an overlong
// line.
std::string listingLineFor(const std::filesystem::path& listing, const std::string& fileName) {
    std::ifstream in(listing, std::ios::binary);
    std::string line;
    while (std::getline(in, line)) {
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

void readDataFileListings(const StorageContext& context, platform::ProcessRunner& processes,
                          const std::vector<std::string>& receivers, CatalogFindings& findings,
                          std::chrono::system_clock::time_point now) {
    const std::string model = context.analyzer.readmodel(false);
    const auto listing = context.paths.toLocal(kListingFile);
    for (const auto& receiver : receivers) {
        auto file = findPortDataFile(model, receiver);
        if (!file) {
            continue;
        }
        // A listing left from the previous receiver must not stand in for this one's.
        std::error_code ignored;
        std::filesystem::remove(listing, ignored);
        processes.runCommand("dir /-C \"" + file->path + "\" > " + kListingFile);
        auto fields = splitTokens(listingLineFor(listing, file->fileName), ' ');
        if (fields.empty()) {
            continue;
        }
        int state = catalogAge(fields[0], now);
        if (state != kCatalogNothing && fields.size() >= 4 &&
            std::strtod(fields[3].c_str(), nullptr) != 0) {
            findings[receiver] = state;
        }
    }
}

}  // namespace

void catalogFlash(const StorageContext& context, platform::ProcessRunner& processes,
                  const std::vector<std::string>& receivers, CatalogFindings& findings,
                  std::chrono::system_clock::time_point now) {
    for (const auto& receiver : receivers) {
        findings.emplace(receiver, kCatalogNothing);
    }
    if (context.analyzer.ismmwave()) {
        readDataFileListings(context, processes, receivers, findings, now);
    } else {
        readFlashCatalog(context, receivers, findings, now);
    }
}

}  // namespace storage
