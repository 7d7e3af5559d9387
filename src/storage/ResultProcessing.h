#pragma once

// Turns one receiver's measured data into its characterization image: the compression points
// at 0.05, 0.1, 0.2 and 0.5 dB for every measured frequency, the bad-connection criteria,
// the raw result file, the operator's choice on bad data, and the store into the analyzer.

#include <filesystem>
#include <optional>
#include <string>

#include "platform/OperatorUi.h"
#include "storage/MeasuredResults.h"
#include "storage/RcvrCharImage.h"
#include "storage/StorageContext.h"

namespace storage {

struct Judgement {
    RcvrCharImage image;
    // Every frequency met the criteria (before any operator choice).
    bool passed = true;
    // False when the operator chose to retest: the image is not to be stored.
    bool accepted = true;
    // Why the raw result file could not be written; empty when it was, or none was asked for.
    // The earlier file of that name is then unchanged.
    std::string rawFileError;
};

// Steps up to the operator's decision, without an analyzer. mmwave stops the records at the
// first frequency above the measured range. rawFile, when given, receives the raw result
// text. Bad data asks ui.badDataChoice: Quit raises "User aborted characterization due to
// bad data on receiver <name>", Continue shows the "Warning" box and zeroes the measured
// records. Uses the store's search outputs as working state.
Judgement judgeResults(MeasuredResults& store, const std::string& receiver, bool mmwave,
                       const std::optional<std::filesystem::path>& rawFile,
                       platform::OperatorUi& ui);

// The whole step: judges (raw file ".\rcvrCharRaw_<name>.txt" when rawFile is set), stores the
// accepted image (per-port file on millimetre-wave systems, flash otherwise) and makes the
// analyzer load it. Returns false when the operator chose to retest (nothing stored). A raw
// file that cannot be written goes to context.fileFailures (raised without one); what is
// stored is first saved through context.backups, whose failure stops the step.
// searchMode is not used.
bool processResults(StorageContext& context, MeasuredResults& store, const std::string& receiver,
                    const std::string& searchMode, bool rawFile);

// ".\rcvrCharRaw_" + name + ".txt", as the file is named in the working directory.
std::string rawResultFileName(const std::string& receiver);

}  // namespace storage
