// `rcvrchar backups`: lists the backups of erased and replaced characterizations in the
// working directory's "backups" folder.

#include <iostream>

#include "cli/CommandRegistry.h"
#include "storage/BackupManifest.h"

namespace {

int listStoredBackups(const std::string& workdir) {
    const std::filesystem::path root = std::filesystem::path(workdir) / "backups";
    std::vector<std::string> unreadable;
    const auto folders = storage::listBackups(root, unreadable);
    for (const auto& reason : unreadable) {
        std::cerr << "Skipped: " << reason << "\n";
    }
    if (folders.empty()) {
        std::cout << "No backups in " << root.string() << "\n";
        return 0;
    }
    for (const auto& [folder, manifest] : folders) {
        std::string receivers;
        for (const auto& e : manifest.entries) {
            receivers += (receivers.empty() ? "" : ", ") + e.receiver;
        }
        std::cout << folder.filename().string() << "  serial " << manifest.serial << "  "
                  << manifest.model << "  receivers " << receivers << "\n";
        for (const auto& e : manifest.entries) {
            std::cout << "  " << e.receiver << ": read " << e.timeRead << " before " << e.reason
                      << ", stored " << e.catalogDate << ", " << e.bytes << " bytes\n";
        }
    }
    return 0;
}

const cli::CommandRegistration registration("backups", [](CLI::App& app) {
    app.description(
        "List the backups taken before characterizations were erased or replaced, in the "
        "working directory's backups folder (restore one with rcvrchar restore FOLDER)");
    auto workdir = std::make_shared<std::string>(".");
    app.add_option("--workdir", *workdir, "Working directory holding the backups folder")
        ->capture_default_str();
    return [workdir] { return listStoredBackups(*workdir); };
});

}  // namespace
