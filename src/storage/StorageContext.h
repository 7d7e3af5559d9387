#pragma once

// What the storage operations reach the analyzer, the operator and the files through. The
// dialog builds one for its own thread and the worker one for the run; the objects outlive it.

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/PathMap.h"
#include "storage/FlashCommandLog.h"

namespace storage {

class FileFailures;
class StoredBackups;

struct StorageContext {
    CNetworkAnalyzer& analyzer;
    platform::OperatorUi& ui;
    platform::Clock& clock;
    const platform::PathMap& paths;
    FlashCommandLog& log;
    // Saves what is stored before it is replaced; none: nothing is saved (tools and tests that
    // work below the dialog).
    StoredBackups* backups = nullptr;
    // Told of whole-file writes that failed; none: the failure is raised instead.
    FileFailures* fileFailures = nullptr;
};

}  // namespace storage
