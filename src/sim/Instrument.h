#pragma once

// The simulated instrument's whole state behind one lock: identity, channel, measurements
// with memory and math, receiver paths, error queue, flash store and per-port data files,
// and the bench (what is cabled to which receiver). Automation objects and the SCPI parser
// reach it through call()/parse(), which lock, record the transcript and refuse objects
// handed out before the last application restart.

#include <cstdint>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <random>
#include <span>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"
#include "platform/Clock.h"
#include "sim/ErrorQueue.h"
#include "sim/FlashStore.h"
#include "sim/Scenario.h"
#include "sim/ScpiCommandTable.h"
#include "sim/Transcript.h"

namespace sim {

struct ChannelState {
    int sweepType = 0;  // 0 linear, 2 power sweep, 3 CW, 4 segment sweep
    double startHz = 10e6;
    double stopHz = 26.5e9;
    double cwHz = 1e9;
    double startPowerDbm = -10.0;
    double stopPowerDbm = 0.0;
    double ifBandwidthHz = 1000.0;
    long points = 201;
    std::vector<automation::SegmentRow> segments;
    bool perSegmentBandwidth = false;
    bool perSegmentPower = false;
    std::map<int, int> attenuatorMode;
    int triggerSetting = 0;
    bool ifBandwidthSwitch = true;
    bool averaging = false;
    int averageCount = 1;
};

struct MeasurementState {
    int id = 0;
    std::string name;
    std::string parameter;    // as defined, e.g. "R1,PORT 1"
    std::string numerator;    // receiver, or the S-parameter
    std::string denominator;  // empty unless a ratio "X/Y"
    bool sParameter = false;
    int sourcePort = 1;
    std::vector<float> mag;    // dB, the (averaged) data trace
    std::vector<float> phase;  // degrees
    int averaged = 0;
    bool hasData = false;
    std::vector<float> memMag;
    std::vector<float> memPhase;
    bool divide = false;
    int firstSetting = 0;
    int secondSetting = 0;
};

// How the source reaches one receiver.
struct Connection {
    int port = 0;  // 0: whichever port sources (the instrument as delivered)
    double lossDb = 0.0;
};

class Instrument {
  public:
    // A healthy receiver input reads this when nothing reaches it.
    static constexpr double noiseFloorDbm = -100.0;
    // What a loose connector's ratio reads after the memory division.
    static constexpr double looseConnectorDb = -0.3;

    Instrument(Scenario scenario, std::filesystem::path stateDirectory,
               std::shared_ptr<platform::Clock> clock);

    // Runs f under the lock after recording the automation call; objects of an earlier
    // application generation raise an error text naming the call.
    template <class F>
    auto call(unsigned generation, const std::string& what, F&& f) {
        std::lock_guard lock(m_mutex);
        m_transcript.record('@', what);
        checkGeneration(generation, what);
        return f();
    }

    std::string parse(unsigned generation, const std::string& command);
    unsigned generation() const;
    // Volatile state back to power-on; flash, files and the bench stay.
    void restartApplication();

    Transcript& transcript() { return m_transcript; }
    const Scenario& scenario() const { return m_scenario; }
    std::filesystem::path driveRoot() const { return m_stateDirectory / "C"; }
    platform::Clock& clock() { return *m_clock; }

    // The model the analyzer software reports: the *IDN? model, or on a millimetre-wave
    // configuration the system model ("T3951A", "T3950A").
    std::string systemModel() const;
    bool isMillimetreWave() const;
    // Local folder of a port's factory calibration data on a millimetre-wave system.
    std::filesystem::path portDataFolder(int port) const;

    // --- under the lock (inside call()) ---
    void preset();
    ChannelState& channel() { return m_channel; }
    const ChannelState& channel() const { return m_channel; }
    void sweep();
    long sweepPoints() const;
    MeasurementState* selectedMeasurement();
    MeasurementState* measurementById(int id);
    const std::vector<MeasurementState>& measurements() const { return m_measurements; }
    // The formatted trace (division applied) into destination; returns a status, 0 = ok.
    long readTrace(int id, int location, int formatCode, long& points,
                   std::span<float> destination);
    void setTriggerSetting(int value) { m_applicationTrigger = value; }

    // --- the bench: the operator's hands (locks by itself) ---
    struct Cable {
        std::string receiver;
        int port = 0;
        double padDb = 0.0;
    };
    // The operator follows one instruction: these receivers are cabled, every other one
    // goes back to its front-panel jumper.
    void cableReceivers(const std::vector<Cable>& cables);
    // The operator checks a receiver that failed its connection check.
    void operatorRecheckedConnection(const std::string& receiver);
    // The operator checks the pad after a power-ratio complaint and fits the right one.
    void operatorRecheckedPad(const std::string& receiver);
    // The bad-data dialog was shown for the receiver: the operator reseats the connector.
    void operatorSawBadData(const std::string& receiver);
    Connection connectionOf(const std::string& receiver) const;

  private:
    struct BenchState {
        Connection connection;
        double instructedPadDb = 0.0;
        int disconnectedLeft = 0;
        bool padRechecked = false;
        int badDataLeft = 0;
        bool cabled = false;
    };

    void checkGeneration(unsigned generation, const std::string& what) const;
    void buildCommands();
    std::string executeUnit(std::string_view unit);
    void applyErrorRules(std::string_view unit);
    void seedStoredCalibrations();

    // Readings.
    std::optional<Connection> reach(const std::string& receiver, int sourcePort) const;
    std::string characterizedReceiver(const MeasurementState& m) const;
    void synthesize(const MeasurementState& m, double sourceDbm, double frequencyHz, float& mag,
                    float& phase);
    double narrowbandOffsetDb(const std::string& receiver) const;
    double sourcePowerDbm(int port) const;
    std::vector<double> pointPowers(int sourcePort) const;
    std::vector<double> pointFrequencies() const;

    // Measurements.
    MeasurementState& defineMeasurement(const std::string& name, const std::string& parameter);
    MeasurementState& measurementNamed(const std::string& name);
    void deleteMeasurement(const std::string& name);
    std::string parsePortText(const std::string& text) const;

    // Flash and millimetre-wave data files.
    void pushPortData(int port);

    mutable std::mutex m_mutex;
    Scenario m_scenario;
    std::filesystem::path m_stateDirectory;
    std::shared_ptr<platform::Clock> m_clock;
    Transcript m_transcript;
    ErrorQueue m_errors;
    FlashStore m_flash;
    ScpiCommandTable m_commands;
    unsigned m_generation = 1;
    std::vector<int> m_errorRuleUses;
    std::mt19937 m_noise{20260412};

    // Volatile application state.
    ChannelState m_channel;
    std::vector<MeasurementState> m_measurements;
    int m_nextMeasurementId = 1;
    int m_selectedId = 0;
    std::map<std::pair<int, int>, std::string> m_traceFeeds;
    std::map<std::pair<int, int>, double> m_traceScale;
    std::map<std::string, std::string> m_pathElements;
    std::map<int, double> m_sourcePower;
    bool m_powerCoupled = true;
    std::map<std::string, bool> m_diagStates;
    std::string m_statisticsType = "MEAN";
    bool m_statistics = false;
    bool m_lowFrequencyExtension = false;
    std::string m_dataFormat = "ASC";
    int m_applicationTrigger = 0;
    int m_flashLoads = 0;

    // Physical, survives restarts.
    std::map<std::string, BenchState> m_bench;
};

}  // namespace sim
