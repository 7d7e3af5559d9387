#include "cli/WorkFolderLock.h"

#include <filesystem>

namespace cli {

WorkFolderLocks::WorkFolderLocks(const AnalyzerOptions& options, const std::string& holder,
                                 Scope scope) {
    std::error_code ec;
    // A working folder that does not exist is refused by the session with its own message.
    if (!std::filesystem::is_directory(options.workdir, ec)) {
        return;
    }
    std::vector<std::filesystem::path> folders;
    if (scope == Scope::WorkingFolderAndState) {
        folders.push_back(std::filesystem::weakly_canonical(options.workdir, ec));
    }
    if (options.analyzer == "sim" || options.analyzer.rfind("sim:", 0) == 0) {
        const std::filesystem::path state =
            options.simState.empty() ? std::filesystem::path(options.workdir) / "analyzer-sim"
                                     : std::filesystem::path(options.simState);
        auto canonical = std::filesystem::weakly_canonical(state, ec);
        if (folders.empty() || canonical != folders.front()) {
            folders.push_back(canonical);
        }
    }
    for (const auto& folder : folders) {
        m_locks.push_back(std::make_unique<platform::FolderLock>(folder, holder));
    }
}

}  // namespace cli
