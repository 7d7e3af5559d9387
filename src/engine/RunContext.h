#pragma once

// Everything one characterization run is handed by the dialog. The dialog keeps every
// referenced object alive, and leaves them alone, until the worker has returned.

#include <filesystem>
#include <string>
#include <vector>

#include "engine/RememberedConnection.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "platform/RunSignals.h"
#include "storage/CatalogFindings.h"

class CNetworkAnalyzer;
class CNAData;
namespace storage {
class FileFailures;
class FlashCommandLog;
class StoredBackups;
}  // namespace storage

namespace engine {

struct RunContext {
    CNetworkAnalyzer& proxy;
    CNAData& configuration;
    // Receiver display names ("R1", "A", "R1 LOW FREQUENCY EXTENSION"), in run order.
    std::vector<std::string> receivers;
    // "Direct-Search" or "Port-Search"; direct when the text contains "Direct".
    std::string searchMode;
    // Receiver name -> catalog state; a completed receiver is set to 2.
    storage::CatalogFindings& catalogFindings;

    platform::OperatorUi& ui;
    platform::Clock& clock;
    const platform::PathMap& paths;
    platform::RunSignals& signals;
    platform::NoticeSink& notices;
    // Receives the raw CSV exports and the raw result files (".").
    std::filesystem::path workingDirectory;
    storage::FlashCommandLog& flashLog;
    RememberedConnection& connection = RememberedConnection::processWide();
    // Saves what is stored before a store replaces it; none: nothing is saved.
    storage::StoredBackups* backups = nullptr;
    // Told of raw files that could not be written; none: the failure ends the run.
    storage::FileFailures* fileFailures = nullptr;
    // Where a receiver's earlier raw files go before a new attempt writes its own; empty:
    // they are replaced.
    std::filesystem::path historyDirectory{};
};

}  // namespace engine
