// `rcvrchar restore BACKUP`: writes the characterizations of a backup folder back into the
// analyzer the way a run stores them, and reads each back. Prints one line per receiver.

#include <algorithm>
#include <iostream>

#include "analyzer/NetworkAnalyzerClass.h"
#include "cli/AnalyzerOptions.h"
#include "cli/CommandRegistry.h"
#include "cli/WorkFolderLock.h"
#include "platform/ErrorText.h"
#include "platform/ScriptedOperatorUi.h"
#include "storage/BackupManifest.h"
#include "storage/FlashCommandLog.h"
#include "storage/ReceiverNames.h"
#include "storage/RestoreBackup.h"
#include "storage/StoredBackups.h"

namespace {

struct RestoreOptions {
    cli::AnalyzerOptions analyzer;
    std::string backup;
    std::vector<std::string> receivers;
    bool force = false;
};

// The folder as given, or under the working directory's "backups".
std::filesystem::path backupFolder(const std::string& backup,
                                   const std::filesystem::path& workingDirectory) {
    std::error_code ec;
    if (std::filesystem::is_directory(backup, ec)) {
        return backup;
    }
    const auto underBackups = workingDirectory / "backups" / backup;
    if (std::filesystem::is_directory(underBackups, ec)) {
        return underBackups;
    }
    throw std::string("No backup folder " + backup + " (nor " + underBackups.string() +
                      "); rcvrchar backups lists them");
}

std::vector<storage::BackupEntry> chosenEntries(const storage::BackupManifest& manifest,
                                                const std::vector<std::string>& wanted) {
    if (wanted.empty()) {
        return manifest.entries;
    }
    std::vector<storage::BackupEntry> chosen;
    for (const auto& name : wanted) {
        const auto found = std::find_if(
            manifest.entries.begin(), manifest.entries.end(),
            [&](const auto& e) { return e.receiver == storage::shortReceiverName(name); });
        if (found == manifest.entries.end()) {
            std::string held;
            for (const auto& e : manifest.entries) {
                held += (held.empty() ? "" : ", ") + e.receiver;
            }
            throw std::string("The backup holds no characterization of receiver " + name +
                              "; it holds " + held);
        }
        chosen.push_back(*found);
    }
    return chosen;
}

int restore(const RestoreOptions& options) {
    cli::WorkFolderLocks locks(options.analyzer, "restore");
    cli::AnalyzerSession session(options.analyzer);
    const auto folder =
        std::filesystem::absolute(backupFolder(options.backup, session.workingDirectory()))
            .lexically_normal();
    const auto manifest = storage::readManifest(folder);
    const auto entries = chosenEntries(manifest, options.receivers);

    // No operator: any box the analyzer raises ends that receiver's restore with its text.
    platform::ScriptedOperatorUi ui;
    CNetworkAnalyzer analyzer("", ui, session.clock());
    if (analyzer.quitRequested()) {
        throw std::string("The analyzer application could not be reached");
    }
    analyzer.readmodel(true);
    analyzer.readoptions(true);
    const std::string serial = storage::serialOf(analyzer.sendscpi("*IDN?"));
    if (serial != manifest.serial && !options.force) {
        throw std::string("The backup " + folder.string() +
                          " was read from the instrument with serial number " + manifest.serial +
                          ", this analyzer's is " + serial +
                          "; nothing restored (--force restores it anyway)");
    }
    storage::FlashCommandLog log(session.paths());
    storage::StoredBackups backups((session.workingDirectory() / "backups").lexically_normal(),
                                   session.processes());
    storage::StorageContext context{analyzer, ui, session.clock(), session.paths(), log, &backups};
    int failures = 0;
    for (const auto& entry : entries) {
        try {
            storage::restoreEntry(context, folder, entry);
            std::cout << entry.receiver << ": restored from " << (folder / entry.dataFile).string()
                      << " (" << entry.bytes << " bytes, stored " << entry.catalogDate
                      << "), read back equal\n";
        } catch (...) {
            ++failures;
            std::cout << entry.receiver << ": NOT restored: " << platform::currentErrorText()
                      << "\n";
        }
    }
    if (failures > 0) {
        std::cerr << failures << " of " << entries.size() << " receivers not restored\n";
        return 1;
    }
    return 0;
}

const cli::CommandRegistration registration("restore", [](CLI::App& app) {
    app.description(
        "Write the characterizations of a backup folder back into the analyzer (flash, or data "
        "file and push), load them and read each back; what the analyzer held first is backed "
        "up too");
    auto options = std::make_shared<RestoreOptions>();
    app.add_option("BACKUP", options->backup,
                   "Backup folder, as a path or a name in the working directory's backups "
                   "folder (rcvrchar backups lists them)")
        ->required();
    app.add_option("--receiver", options->receivers,
                   "Restore only these receivers (repeatable), e.g. --receiver R1");
    app.add_flag("--force", options->force,
                 "Restore a backup read from an instrument with another serial number");
    cli::addAnalyzerOptions(app, options->analyzer);
    return [options] { return restore(*options); };
});

}  // namespace
