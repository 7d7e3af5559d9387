// `rcvrchar export`: reads the analyzer's catalog and writes every stored characterization
// into "RcvrChar_<flash name>_Exported.txt" in the working directory, without asking (the
// command is the consent). Prints the names of the files written.

#include <iostream>

#include "analyzer/NetworkAnalyzerClass.h"
#include "cli/AnalyzerOptions.h"
#include "cli/CommandRegistry.h"
#include "cli/WorkFolderLock.h"
#include "platform/ScriptedOperatorUi.h"
#include "storage/ExportCals.h"
#include "storage/FlashCatalog.h"
#include "storage/FlashCommandLog.h"

namespace {

// Every receiver an analyzer can hold, in the configuration's order. The low-frequency
// extensions keep their data in the reference receivers' port files on millimetre-wave
// systems, so there they would only repeat R1 to R4.
std::vector<std::string> allReceivers(bool millimetreWave) {
    std::vector<std::string> names = {"R1", "R2", "R3", "R4", "A", "B", "C", "D"};
    if (!millimetreWave) {
        for (const char* r : {"R1", "R2", "R3", "R4"}) {
            names.push_back(std::string(r) + " LOW FREQUENCY EXTENSION");
        }
    }
    return names;
}

int exportStored(const cli::AnalyzerOptions& options) {
    const cli::WorkFolderLocks locks(options, "export");
    cli::AnalyzerSession session(options);
    // No operator: any box the analyzer raises ends the command with its text.
    platform::ScriptedOperatorUi ui;
    CNetworkAnalyzer analyzer("", ui, session.clock());
    if (analyzer.quitRequested()) {
        throw std::string("The analyzer application could not be reached");
    }
    analyzer.readmodel(true);
    storage::FlashCommandLog log(session.paths());
    storage::StorageContext context{analyzer, ui, session.clock(), session.paths(), log};

    const auto receivers = allReceivers(analyzer.ismmwave());
    storage::CatalogFindings findings;
    storage::catalogFlash(context, session.processes(), receivers, findings);
    const auto result = storage::exportStoredCals(context, receivers, findings);
    for (const auto& file : result.files) {
        std::cout << file << "\n";
    }
    if (!result.endedAt.empty()) {
        std::cerr << "The export ended at receiver " << result.endedAt << ": " << result.reason
                  << "\n";
    } else if (result.files.empty()) {
        std::cerr << "The analyzer holds no characterization\n";
    }
    return 0;
}

const cli::CommandRegistration registration("export", [](CLI::App& app) {
    app.description("Export every characterization the analyzer holds to text files");
    auto options = std::make_shared<cli::AnalyzerOptions>();
    cli::addAnalyzerOptions(app, *options);
    return [options] { return exportStored(*options); };
});

}  // namespace
