#pragma once

// The constants a run reads at its start, the three power ladders built from them, and the
// choice of ladder, first band and reference power for each receiver.

#include <string>
#include <vector>

class CNAData;

namespace engine {

// count = integer part of ((stop - start) / step + 1.00001); each entry is the previous one
// plus step (accumulated). Empty when count is below 1 or absurdly large.
std::vector<double> powerLadder(double start, double stop, double step);

struct RunConstants {
    int minband = 0;
    int lfeMinband = 0;
    int rchannelMinband = 0;
    std::vector<double> testLadder;
    std::vector<double> lfeLadder;
    std::vector<double> referenceLadder;
    // "key value, key value, key value" of each ladder, for error texts.
    std::string testKeys;
    std::string lfeKeys;
    std::string referenceKeys;
};

// Reads the run's constants in their fixed order and builds the ladders. A ladder that
// comes out empty is kept empty here; the run refuses it when a receiver needs it.
RunConstants readRunConstants(CNAData& config);

struct ReceiverSetup {
    bool reference = false;
    bool lfe = false;
    bool portMode = false;
    std::string searchMode;  // as handed on: LFE receivers always "Port-Search"
    const std::vector<double>* ladder = nullptr;
    std::string ladderKeys;  // names the ladder's keys in errors
    int firstBand = 0;
};

bool isReferenceReceiver(const std::string& name);
// The label used on the analyzer: the name without " LOW FREQUENCY EXTENSION" and after.
std::string receiverLabel(const std::string& name);

// Ladder and first band for one receiver; reads nothing from the configuration.
ReceiverSetup chooseReceiverSetup(const RunConstants& constants, const std::string& name,
                                  const std::string& runSearchMode);
// Raises an error text naming the ladder's keys and values when it has no levels.
void requireLevels(const ReceiverSetup& setup);
// Reads "RChannelRef" or "refpower", whichever applies to the receiver.
double referencePower(CNAData& config, const ReceiverSetup& setup);

}  // namespace engine
