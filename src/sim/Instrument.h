#pragma once

// The simulated instrument's whole state behind one lock: identity, channel, measurements
// with memory and math, receiver paths, error queue, flash store and per-port data files,
// and the bench (what is cabled to which receiver). Automation objects and the SCPI parser
// reach it through call()/parse(), which lock, record the transcript and refuse objects
// handed out before the last application restart.

#include <chrono>
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
#include "scpi/CommandTable.h"
#include "scpi/ErrorQueue.h"
#include "scpi/NumberFormat.h"
#include "scpi/StatusRegisters.h"
#include "sim/FlashStore.h"
#include "sim/Scenario.h"
#include "sim/Transcript.h"

namespace sim {

// Codes as the automation interface numbers them.
enum class SweepType { Linear = 0, Power = 2, Cw = 3, Segment = 4 };
enum class SweepMode { Hold, Continuous, Single };
enum class TriggerSource { External = 1, Immediate = 2, Manual = 3 };
enum class ChannelTrigger { Channel = 0, Sweep = 1, Point = 2, Trace = 3 };

// The trace formats a measurement can show, with the automation's format codes.
enum class TraceFormat {
    LinearMagnitude = 0,
    LogMagnitude = 1,
    Phase = 2,
    GroupDelay = 5,
    Real = 6,
    Imaginary = 7,
    UnwrappedPhase = 9,
    PositivePhase = 14,
};

struct ChannelState {
    SweepType sweepType = SweepType::Linear;
    SweepMode sweepMode = SweepMode::Continuous;
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
    std::map<int, bool> attenuatorAuto;
    ChannelTrigger trigger = ChannelTrigger::Channel;
    bool ifBandwidthTracking = true;
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
    TraceFormat format = TraceFormat::LogMagnitude;
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
    // The most points one sweep takes.
    static constexpr long maxPoints = 100001;

    Instrument(Scenario scenario, std::filesystem::path stateDirectory,
               std::shared_ptr<platform::Clock> clock);

    // Runs f under the lock after recording the automation call. Objects of an earlier
    // application generation raise an error text naming the call; so does an instrument
    // error, which an automation caller receives instead of finding it in the queue.
    template <class F>
    auto call(unsigned generation, const std::string& what, F&& f) {
        std::unique_lock lock(m_mutex);
        HeldLock held(*this, lock);
        m_transcript.record('@', what);
        checkGeneration(generation, what);
        try {
            return f();
        } catch (const scpi::Error& error) {
            throw std::string("simulated analyzer: " + what + ": " + error.message);
        }
    }

    // One program message from the automation parser of an application generation.
    std::string parse(unsigned generation, std::string_view message);
    // One program message from a client on the network, whatever the generation. A query
    // that ran but has nothing to say answers "" (an empty string), so that the client's
    // wait for its response ends.
    std::string execute(std::string_view message);
    std::uint8_t statusByte(bool messageAvailable);
    void reportError(int code, const std::string& message);
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

    // --- Handlers, under the lock (inside call() or parse()). SCPI commands and automation
    // calls both reach the instrument through these; they raise scpi::Error. ---

    // Application.
    void preset();
    // Returns when the sweep in progress is done, or after the limit; the lock is released
    // meanwhile so that other clients are served.
    void waitForSweep(std::chrono::milliseconds limit);
    void setTriggerSource(TriggerSource source) { m_triggerSource = source; }
    TriggerSource triggerSource() const { return m_triggerSource; }

    // Channel and source.
    const ChannelState& channel() const { return m_channel; }
    void setSweepType(SweepType type) { m_channel.sweepType = type; }
    void setSweepMode(SweepMode mode);
    // One sweep of every measurement now.
    void initiate();
    long sweepPoints() const;
    void setPoints(long points);
    void setChannelTrigger(ChannelTrigger trigger) { m_channel.trigger = trigger; }
    double startFrequency() const;
    double stopFrequency() const;
    void setStartFrequency(double hz);
    void setStopFrequency(double hz);
    void setCwFrequency(double hz);
    void setIfBandwidth(double hz);
    void setIfBandwidthTracking(bool on) { m_channel.ifBandwidthTracking = on; }
    void setStartPower(double dbm);
    void setStopPower(double dbm);
    void setAttenuatorAuto(int port, bool automatic);
    bool attenuatorAuto(int port) const;
    // The stimulus of every point: frequencies, or source powers in a power sweep.
    std::vector<double> stimulusValues() const;
    std::vector<double> pointFrequencies() const;

    // Segment table.
    void writeSegments(std::vector<automation::SegmentRow> rows);
    void setPerSegmentBandwidth(bool on) { m_channel.perSegmentBandwidth = on; }
    void setPerSegmentPower(bool on) { m_channel.perSegmentPower = on; }

    // Measurements, by their numbers.
    std::vector<int> measurementNumbers() const;
    MeasurementState& measurementNumbered(int number);
    // 0 when none is selected.
    int selectedMeasurementNumber();
    MeasurementState* selectedMeasurement();
    MeasurementState* measurementById(int id);
    const std::vector<MeasurementState>& measurements() const { return m_measurements; }
    // The formatted trace (division applied) into destination; returns a status, 0 = ok.
    long readTrace(int id, int location, int formatCode, long& points,
                   std::span<float> destination);

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
    // The bench operations under the lock, for the simulator-only bench commands.
    void cableReceiversHeld(const std::vector<Cable>& cables);
    void operatorRecheckedConnectionHeld(const std::string& receiver);
    void operatorRecheckedPadHeld(const std::string& receiver);
    void operatorSawBadDataHeld(const std::string& receiver);
    void addBenchCommands();

    struct BenchState {
        Connection connection;
        double instructedPadDb = 0.0;
        int disconnectedLeft = 0;
        bool padRechecked = false;
        int badDataLeft = 0;
        bool cabled = false;
    };

    // Makes the caller's lock known to handlers that wait.
    class HeldLock {
      public:
        HeldLock(Instrument& instrument, std::unique_lock<std::mutex>& lock)
            : m_instrument(instrument), m_previous(instrument.m_heldLock) {
            instrument.m_heldLock = &lock;
        }
        ~HeldLock() { m_instrument.m_heldLock = m_previous; }
        HeldLock(const HeldLock&) = delete;
        HeldLock& operator=(const HeldLock&) = delete;

      private:
        Instrument& m_instrument;
        std::unique_lock<std::mutex>* m_previous;
    };

    void checkGeneration(unsigned generation, const std::string& what) const;
    void buildCommands();
    void addCommonCommands();
    void addChannelCommands();
    void addMeasurementCommands();
    void addDataCommands();
    void addFileCommands();
    void addDiagnosticCommands();
    // answeredQuery, when given, is set when a query of the message ran without error.
    std::string runMessage(std::string_view message, bool* answeredQuery = nullptr);
    void queueError(int code, const std::string& message);
    void applyErrorRules(std::string_view unit);
    void seedStoredCalibrations();
    void sweep();

    // Readings.
    std::optional<Connection> reach(const std::string& receiver, int sourcePort) const;
    std::string characterizedReceiver(const MeasurementState& m) const;
    void synthesize(const MeasurementState& m, double sourceDbm, double frequencyHz, float& mag,
                    float& phase);
    double narrowbandOffsetDb(const std::string& receiver) const;
    double sourcePowerDbm(int port) const;
    std::vector<double> pointPowers(int sourcePort) const;
    std::chrono::milliseconds sweepDuration() const;

    // Measurements.
    MeasurementState& defineMeasurement(const std::string& name, const std::string& parameter);
    MeasurementState& measurementNamed(const std::string& name);
    void deleteMeasurement(const std::string& name);
    std::string parsePortText(const std::string& text) const;

    // Replies of trace data in the data format the client chose.
    void appendValues(std::string& reply, std::span<const double> values) const;

    // Files on the analyzer computer's drive; refuses any path that would leave it.
    std::filesystem::path drivePath(const std::string& text) const;

    // Flash and millimetre-wave data files.
    void pushPortData(int port);

    mutable std::mutex m_mutex;
    std::unique_lock<std::mutex>* m_heldLock = nullptr;
    Scenario m_scenario;
    std::filesystem::path m_stateDirectory;
    std::shared_ptr<platform::Clock> m_clock;
    Transcript m_transcript;
    scpi::ErrorQueue m_errors;
    scpi::StatusRegisters m_status;
    FlashStore m_flash;
    scpi::CommandTable m_commands;
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
    scpi::DataFormat m_dataFormat = scpi::DataFormat::Ascii;
    scpi::ByteOrder m_byteOrder = scpi::ByteOrder::Normal;
    TriggerSource m_triggerSource = TriggerSource::Immediate;
    // How long the sweep in progress still takes.
    std::chrono::milliseconds m_sweepLeft{0};
    int m_flashLoads = 0;

    // Physical, survives restarts.
    std::map<std::string, BenchState> m_bench;
    std::map<std::string, int> m_corruptFlashWritesLeft;
};

}  // namespace sim
