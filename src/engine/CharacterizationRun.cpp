#include "engine/CharacterizationRun.h"

#include "analyzer/NetworkAnalyzerClass.h"
#include "config/NAData.h"
#include "engine/AttemptHistory.h"
#include "engine/CompressionData.h"
#include "engine/SegmentSweep.h"
#include "engine/TestParameters.h"
#include "platform/ErrorText.h"
#include "storage/FileFailures.h"
#include "storage/ReceiverNames.h"
#include "storage/ResultProcessing.h"

namespace engine {

namespace {

// A raw file that cannot be written is reported and the run goes on: the characterization it
// comes with is still right. Without anyone to tell, the run ends on it.
void reportOrRaise(RunContext& context, const std::string& text) {
    if (!context.fileFailures) {
        throw text;
    }
    context.fileFailures->report(text);
}

// Writes the raw measured data after moving the earlier attempt's raw files aside.
void writeRawFiles(RunContext& context, const CCompressionData& store,
                   const std::string& shortName) {
    if (!context.historyDirectory.empty()) {
        for (const auto& file :
             {context.workingDirectory / CCompressionData::measuredDataFileName(shortName),
              context.paths.toLocal(storage::rawResultFileName(shortName))}) {
            try {
                keepEarlierAttempt(file, context.historyDirectory);
            } catch (...) {
                reportOrRaise(
                    context, platform::currentErrorText() + "; the new attempt's file replaces it");
            }
        }
    }
    try {
        store.writeAllMeasuredData(shortName, context.workingDirectory);
    } catch (...) {
        reportOrRaise(context, platform::currentErrorText());
    }
}

struct Segment {
    int first;
    int last;
};

// Band offsets of the segments, relative to the plan's first band.
std::vector<Segment> bandSegments(CNAData& config, const ReceiverSetup& setup, int firstBand,
                                  int lastBand) {
    if (setup.reference && config.HasConstant("Rchannel_BandBreak")) {
        const int breakBand = static_cast<int>(config.GetConstant("Rchannel_BandBreak")) - 1;
        // A break below the plan's first band leaves nothing for the first segment.
        if (breakBand < lastBand && breakBand >= firstBand) {
            return {{0, breakBand - firstBand}, {breakBand - firstBand + 1, lastBand - firstBand}};
        }
    }
    return {{0, lastBand - firstBand}};
}

// Measures one receiver; returns whether result processing accepted it.
bool characterizeReceiver(RunContext& context, SweepContext& sweep,
                          storage::StorageContext& storage, const RunConstants& constants,
                          const std::string& name) {
    CNAData& config = context.configuration;
    CCompressionData& store = sweep.store;
    const ReceiverSetup setup = chooseReceiverSetup(constants, name, context.searchMode);
    config.SetLFEMode(setup.lfe);
    const double refPower = referencePower(config, setup);
    store.loadTestParameters(config, setup.firstBand);
    store.setPowerLevels(*setup.ladder);
    const std::string portText = config.Calibration(name).GetPort();
    const int lastBand = store.getMaxBand();
    const auto segments = bandSegments(config, setup, setup.firstBand, lastBand);

    context.notices.postnotice("Started Cal " + name + "\r\n");
    const auto& ladder = *setup.ladder;
    const int count = static_cast<int>(ladder.size());
    for (std::size_t s = 0; s < segments.size(); ++s) {
        const Segment& segment = segments[s];
        prepareSegment(sweep, refPower, name, portText, setup.searchMode, segment.first,
                       segment.last, static_cast<int>(s));
        for (int k = 0; k < count; ++k) {
            sweep.checkabort();
            if (context.signals.onStep) {
                context.signals.onStep({name, static_cast<int>(s) + 1,
                                        static_cast<int>(segments.size()), k + 1, count});
            }
            measurePowerLevel(sweep, ladder[k], k, segment.first, segment.last);
            if (s + 1 == segments.size() && count - k - 1 == 5) {
                context.notices.postnotice("Almost Done with Cal\r\n");
            }
        }
    }

    const std::string shortName = storage::shortReceiverName(name);
    context.notices.postnotice("Writing Cal File\r\n");
    context.notices.postnotice(".\r\n");
    writeRawFiles(context, store, shortName);
    const bool accepted =
        storage::processResults(storage, store, shortName, setup.searchMode, true);
    if (accepted) {
        context.notices.postnotice("Cal Complete\r\n");
        context.catalogFindings[name] = storage::kCatalogCharacterized;
    } else {
        context.notices.postnotice("Cal will be repeated\r\n");
    }
    context.proxy.clearmeasurements();
    store.clearMeasurements();
    return accepted;
}

void runReceivers(RunContext& context) {
    context.notices.postnotice("Cal Started\r\n");
    context.notices.postnotice("NOTE: IF overload and unleveled messages are expected.\r\n");
    CCompressionData store(context.ui);
    context.configuration.RequiredPorts();
    const RunConstants constants = readRunConstants(context.configuration);
    // A ladder without levels cannot be measured: refuse before the first measurement.
    for (const auto& name : context.receivers) {
        requireLevels(chooseReceiverSetup(constants, name, context.searchMode));
    }

    SweepContext sweep{context.proxy, context.configuration, store,           context.ui,
                       context.clock, context.signals,       context.notices, context.connection};
    storage::StorageContext storage{context.proxy,       context.ui,       context.clock,
                                    context.paths,       context.flashLog, context.backups,
                                    context.fileFailures};
    for (std::size_t i = 0; i < context.receivers.size();) {
        if (characterizeReceiver(context, sweep, storage, constants, context.receivers[i])) {
            ++i;
        }
    }
}

}  // namespace

int runCharacterization(RunContext& context) {
    int exitCode = 0;
    try {
        runReceivers(context);
    } catch (const platform::WorkerAborted&) {
        // checkabort has already told the operator.
        exitCode = 1;
    } catch (...) {
        const std::string text = platform::currentErrorText();
        try {
            context.ui.messageBox({text, "Error", platform::Buttons::Ok,
                                   platform::BoxSystemModal | platform::BoxTopmost});
            context.notices.postnotice("Error in Cal\r\n");
        } catch (...) {
            // The run is over either way; the indicator below must still be cleared.
        }
        exitCode = 1;
    }
    context.signals.workerRunning = false;
    return exitCode;
}

}  // namespace engine
