#include "engine/AttemptHistory.h"

namespace engine {

void keepEarlierAttempt(const std::filesystem::path& file,
                        const std::filesystem::path& historyFolder) {
    std::error_code ec;
    if (!std::filesystem::exists(file, ec)) {
        return;
    }
    const auto fail = [&](const std::string& reason) {
        return std::string("Cannot keep the earlier " + file.filename().string() + " in " +
                           historyFolder.string() + ": " + reason);
    };
    std::filesystem::create_directories(historyFolder, ec);
    if (ec) {
        throw fail(ec.message());
    }
    std::filesystem::path kept;
    for (int n = 1;; ++n) {
        kept = historyFolder /
               (file.stem().string() + "." + std::to_string(n) + file.extension().string());
        if (!std::filesystem::exists(kept, ec)) {
            break;
        }
    }
    std::filesystem::rename(file, kept, ec);
    if (ec) {
        throw fail(ec.message());
    }
}

}  // namespace engine
