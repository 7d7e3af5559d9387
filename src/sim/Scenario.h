#pragma once

// What the simulated instrument is: identity, options, receiver physics, calibrations that
// are already stored, and the faults it shows. Read from JSON; every key is optional and
// `{}` is a healthy 4-port T3872A without options and with nothing stored.

#include <filesystem>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace sim {

// Rapp AM/AM compression and AM/PM of one receiver (docs/simulator.md).
struct ReceiverParameters {
    // Psat at 0 Hz; it moves with frequency by the slope and the ripple.
    double psatDbm = 0.0;
    double psatSlopeDbPerGhz = 0.0;
    double psatRippleDb = 0.0;
    double psatRipplePeriodGhz = 5.0;
    double smoothness = 1.0;
    double amPmDegPerDb = 3.0;
    // Standard deviation of the Gaussian reading noise, dB.
    double noiseDb = 0.0;
};

struct StoredCalibration {
    std::string receiver;
    double ageDays = 0.0;
    // Exactly one of the two: a valid image of that many records, or a block of words.
    std::optional<long> records;
    std::optional<long> words;
};

struct ScpiErrorRule {
    // Case-insensitive prefix of the command after which the errors are queued.
    std::string command;
    std::vector<std::string> errors;
    int times = 1;
};

// A link fault tied to messages that start with `command` (case-insensitive), for the first
// `times` of them.
struct LinkRule {
    std::string command;
    int times = 1;
};

// A link fault after every `commands` program messages the instrument has run, counted over
// all clients, `times` times in all.
struct LinkCount {
    long commands = 0;
    int times = 1;
};

// Faults of the network link of a served instrument; the in-process simulator ignores them.
struct LinkFaultRules {
    std::optional<LinkCount> dropAfterCommands;
    std::vector<LinkRule> dropMidResponseOn;
    std::vector<LinkRule> stallOn;
    std::vector<LinkRule> garbageOn;
    int splitReplyMs = 0;
    std::optional<LinkCount> restartAfterCommands;
};

struct Faults {
    std::map<std::string, int> disconnected;
    std::map<std::string, double> wrongPadDb;
    std::map<std::string, double> narrowbandLossDb;
    std::map<std::string, std::string> attenuatorReply;
    std::map<std::string, int> badData;
    // Flash writes of the receiver's calibration that store one word wrong.
    std::map<std::string, int> corruptFlashWrites;
    std::vector<ScpiErrorRule> scpiErrors;
    LinkFaultRules link;
};

struct Scenario {
    std::string idn = "Velquor Technologies,T3872A,MY00000001,A.13.55.06";
    std::string options;
    int portCount = 4;
    std::string mmwaveCatalog = "Default";
    std::string mmwaveActive = "Default";
    std::string appDir = "C:\\Program Files (x86)\\Velquor\\Network Analyzer";
    // Every receiver of the instrument (R1..Rn, A..), defaults already applied.
    std::map<std::string, ReceiverParameters> receivers;
    std::vector<StoredCalibration> stored;
    Faults faults;

    Scenario();
    // Raise an error text naming the offending key, value or type.
    static Scenario fromJson(const std::string& text);
    static Scenario fromFile(const std::filesystem::path& path);

    // The receivers this port count offers, reference receivers first.
    std::vector<std::string> receiverNames() const;
    bool hasReceiver(const std::string& name) const;
    const ReceiverParameters& receiver(const std::string& name) const;
};

// Defaults chosen so that the sample configuration's ladders (about -30 to 0 dBm source
// power, 20 dB pads before reference receivers) reach all four compression levels.
ReceiverParameters defaultReceiverParameters(const std::string& receiver);

}  // namespace sim
