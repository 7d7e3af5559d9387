#include "sim/Instrument.h"
#include "platform/UpperCase.h"

#include <algorithm>
#include <cctype>
#include <cmath>

#include "sim/ReceiverPhysics.h"

namespace sim {
namespace {

// Degrees of phase error per dB of magnitude error for small noise.
constexpr double phaseNoisePerDb = 6.6;

}  // namespace

Instrument::Instrument(Scenario scenario, std::filesystem::path stateDirectory,
                       std::shared_ptr<platform::Clock> clock)
    : m_scenario(std::move(scenario)),
      m_stateDirectory(std::move(stateDirectory)),
      m_clock(clock ? std::move(clock) : std::make_shared<platform::VirtualClock>()),
      m_flash(m_stateDirectory / "flash") {
    std::filesystem::create_directories(driveRoot());
    if (isMillimetreWave()) {
        for (int port = 1; port <= m_scenario.portCount; ++port) {
            std::filesystem::create_directories(portDataFolder(port));
        }
    }
    m_errorRuleUses.assign(m_scenario.faults.scpiErrors.size(), 0);
    for (const auto& name : m_scenario.receiverNames()) {
        BenchState& bench = m_bench[name];
        if (auto it = m_scenario.faults.disconnected.find(name);
            it != m_scenario.faults.disconnected.end()) {
            bench.disconnectedLeft = it->second;
        }
        if (auto it = m_scenario.faults.badData.find(name); it != m_scenario.faults.badData.end()) {
            bench.badDataLeft = it->second;
        }
    }
    m_corruptFlashWritesLeft = m_scenario.faults.corruptFlashWrites;
    buildCommands();
    seedStoredCalibrations();
    preset();
}

unsigned Instrument::generation() const {
    std::lock_guard lock(m_mutex);
    return m_generation;
}

void Instrument::checkGeneration(unsigned generation, const std::string& what) const {
    if (generation != m_generation) {
        throw std::string("simulated analyzer: " + what +
                          " on an object of an application that has since been restarted");
    }
}

void Instrument::restartApplication() {
    std::lock_guard lock(m_mutex);
    m_transcript.record('@', "restart application");
    ++m_generation;
    m_errors.clear();
    m_status = scpi::StatusRegisters{};
    m_diagStates.clear();
    m_flashLoads = 0;
    preset();
}

std::string Instrument::systemModel() const {
    const std::string& idn = m_scenario.idn;
    auto first = idn.find(',');
    std::string model = idn.substr(first + 1, idn.find(',', first + 1) - first - 1);
    bool bVersion = model.rfind("T3", 0) == 0 && (model.find("2B") != std::string::npos ||
                                                  model.find("7B") != std::string::npos);
    if (bVersion && m_scenario.mmwaveCatalog.find(',') != std::string::npos &&
        m_scenario.mmwaveActive.find("Broadband") != std::string::npos) {
        return m_scenario.mmwaveActive.find("T3950A") != std::string::npos ? "T3950A" : "T3951A";
    }
    return model;
}

bool Instrument::isMillimetreWave() const {
    const std::string& idn = m_scenario.idn;
    auto first = idn.find(',');
    return systemModel() != idn.substr(first + 1, idn.find(',', first + 1) - first - 1);
}

std::filesystem::path Instrument::portDataFolder(int port) const {
    return driveRoot() / "ProgramData" / "Velquor" / "Network Analyzer" / "Configurations" /
           (systemModel() + " Broadband") / ("Port " + std::to_string(port)) / "Factory Cal Data";
}

void Instrument::preset() {
    m_channel = ChannelState{};
    m_measurements.clear();
    m_traceFeeds.clear();
    m_traceScale.clear();
    m_pathElements.clear();
    m_pathElements["IFSIGPATHALL"] = "WBF";
    m_pathElements["PORT1REFMXR"] = "INTERNAL";
    m_sourcePower.clear();
    m_powerCoupled = true;
    m_statisticsType = "MEAN";
    m_statistics = false;
    m_lowFrequencyExtension = false;
    m_dataFormat = scpi::DataFormat::Ascii;
    m_byteOrder = scpi::ByteOrder::Normal;
    m_triggerSource = TriggerSource::Immediate;
    m_sweepLeft = std::chrono::milliseconds(0);
    MeasurementState& s11 = defineMeasurement("CH1_S11_1", "S11");
    m_traceFeeds[{1, 1}] = s11.name;
}

// ---------------------------------------------------------------- readings

double Instrument::sourcePowerDbm(int port) const {
    auto it = m_sourcePower.find(port);
    return it == m_sourcePower.end() ? -10.0 : it->second;
}

std::optional<Connection> Instrument::reach(const std::string& receiver, int sourcePort) const {
    auto it = m_bench.find(receiver);
    if (it == m_bench.end() || it->second.disconnectedLeft > 0) {
        return std::nullopt;
    }
    const Connection& c = it->second.connection;
    if (c.port != 0 && c.port != sourcePort) {
        return std::nullopt;
    }
    return c;
}

std::string Instrument::characterizedReceiver(const MeasurementState& m) const {
    // The receiver under test is the one that also has an unratioed measurement.
    for (const auto& other : m_measurements) {
        if (!other.sParameter && other.denominator.empty() &&
            (other.numerator == m.numerator || other.numerator == m.denominator)) {
            return other.numerator;
        }
    }
    return m.numerator;
}

double Instrument::narrowbandOffsetDb(const std::string& receiver) const {
    auto path = m_pathElements.find("IFSIGPATHALL");
    if (path == m_pathElements.end() || path->second != "NBF") {
        return 0.0;
    }
    auto fault = m_scenario.faults.narrowbandLossDb.find(receiver);
    return fault == m_scenario.faults.narrowbandLossDb.end() ? -3.0 : fault->second;
}

void Instrument::synthesize(const MeasurementState& m, double sourceDbm, double frequencyHz,
                            float& mag, float& phase) {
    double magDb = 0.0;
    double phaseDeg = 0.0;
    double noiseDb = 0.0;
    if (!m.sParameter) {
        std::string receiver = m.denominator.empty() ? m.numerator : characterizedReceiver(m);
        const ReceiverParameters& physics = m_scenario.receiver(receiver);
        noiseDb = physics.noiseDb;
        auto connection = reach(receiver, m.sourcePort);
        if (!connection) {
            magDb = m.denominator.empty() ? noiseFloorDbm : noiseFloorDbm - sourceDbm;
        } else {
            double input = sourceDbm - connection->lossDb;
            double compression = compressionDb(physics, input, frequencyHz);
            phaseDeg = physics.amPmDegPerDb * compression;
            magDb = m.denominator.empty() ? input + compression + narrowbandOffsetDb(receiver)
                                          : connection->lossDb + compression;
        }
    }
    if (noiseDb > 0.0) {
        std::normal_distribution<double> gauss(0.0, noiseDb);
        magDb += gauss(m_noise);
        phaseDeg += phaseNoisePerDb * gauss(m_noise);
    }
    mag = static_cast<float>(magDb);
    phase = static_cast<float>(phaseDeg);
}

long Instrument::sweepPoints() const {
    if (m_channel.sweepType != SweepType::Segment) {
        return m_channel.points;
    }
    long total = 0;
    for (const auto& row : m_channel.segments) {
        if (row.on != 0) {
            total += static_cast<long>(row.points);
        }
    }
    return total;
}

std::vector<double> Instrument::pointPowers(int sourcePort) const {
    std::vector<double> powers;
    powers.reserve(static_cast<std::size_t>(sweepPoints()));
    const double source = sourcePowerDbm(sourcePort);
    switch (m_channel.sweepType) {
        case SweepType::Power: {
            const long n = m_channel.points;
            for (long i = 0; i < n; ++i) {
                double fraction = n > 1 ? static_cast<double>(i) / static_cast<double>(n - 1) : 0;
                powers.push_back(m_channel.startPowerDbm +
                                 fraction * (m_channel.stopPowerDbm - m_channel.startPowerDbm));
            }
            break;
        }
        case SweepType::Segment:
            for (const auto& row : m_channel.segments) {
                if (row.on != 0) {
                    powers.insert(powers.end(), static_cast<std::size_t>(row.points),
                                  m_channel.perSegmentPower ? row.power : source);
                }
            }
            break;
        default:
            powers.assign(static_cast<std::size_t>(m_channel.points), source);
    }
    return powers;
}

std::vector<double> Instrument::pointFrequencies() const {
    std::vector<double> frequencies;
    frequencies.reserve(static_cast<std::size_t>(sweepPoints()));
    auto addLine = [&](double start, double stop, long n) {
        for (long i = 0; i < n; ++i) {
            double fraction = n > 1 ? static_cast<double>(i) / static_cast<double>(n - 1) : 0;
            frequencies.push_back(start + fraction * (stop - start));
        }
    };
    switch (m_channel.sweepType) {
        case SweepType::Linear:
            addLine(m_channel.startHz, m_channel.stopHz, m_channel.points);
            break;
        case SweepType::Segment:
            for (const auto& row : m_channel.segments) {
                if (row.on != 0) {
                    addLine(row.start, row.stop, static_cast<long>(row.points));
                }
            }
            break;
        default:
            frequencies.assign(static_cast<std::size_t>(m_channel.points), m_channel.cwHz);
    }
    return frequencies;
}

std::chrono::milliseconds Instrument::sweepDuration() const {
    return std::chrono::milliseconds(static_cast<long long>(
        1000.0 * static_cast<double>(sweepPoints()) / m_channel.ifBandwidthHz));
}

void Instrument::initiate() {
    if (m_channel.sweepType == SweepType::Segment && sweepPoints() == 0) {
        throw scpi::Error{-221, "Settings conflict; segment sweep with no segment on"};
    }
    sweep();
    m_sweepLeft = sweepDuration();
}

void Instrument::waitForSweep(std::chrono::milliseconds limit) {
    const auto wait = std::min(m_sweepLeft, std::max(limit, std::chrono::milliseconds(0)));
    m_sweepLeft = std::chrono::milliseconds(0);
    if (m_heldLock) {
        m_heldLock->unlock();
    }
    m_clock->wait(wait);
    if (m_heldLock) {
        m_heldLock->lock();
    }
}

void Instrument::sweep() {
    const std::vector<double> frequencies = pointFrequencies();
    for (auto& m : m_measurements) {
        const std::vector<double> powers = pointPowers(m.sourcePort);
        const std::size_t n = powers.size();
        bool loose = false;
        if (!m.denominator.empty() && m.memMag.size() == n) {
            loose = m_bench.at(characterizedReceiver(m)).badDataLeft > 0;
        }
        if (m.mag.size() != n || !m_channel.averaging) {
            m.averaged = 0;
        }
        m.mag.resize(n);
        m.phase.resize(n);
        const int weight = std::min(m.averaged + 1, std::max(1, m_channel.averageCount));
        for (std::size_t i = 0; i < n; ++i) {
            float mag = 0.0f;
            float phase = 0.0f;
            if (loose) {
                mag = m.memMag[i] + static_cast<float>(looseConnectorDb);
                phase = m.memPhase[i];
            } else {
                synthesize(m, powers[i], frequencies[i], mag, phase);
            }
            if (m.averaged == 0) {
                m.mag[i] = mag;
                m.phase[i] = phase;
            } else {
                m.mag[i] += (mag - m.mag[i]) / static_cast<float>(weight);
                m.phase[i] += (phase - m.phase[i]) / static_cast<float>(weight);
            }
        }
        m.averaged = m_channel.averaging ? weight : 0;
        m.hasData = true;
    }
}

long Instrument::readTrace(int id, int location, int formatCode, long& points,
                           std::span<float> destination) {
    constexpr long badArgument = 0x57;  // the automation layer's "invalid argument"
    constexpr long noData = 0x15;       // "device not ready": nothing swept yet
    MeasurementState* m = &measurementNumbered(id);
    if (location != 2) {
        return badArgument;
    }
    if (!m->hasData) {
        points = 0;
        return noData;
    }
    const std::size_t n = std::min(
        {m->mag.size(), destination.size(), static_cast<std::size_t>(std::max(points, 0L))});
    const bool divided = m->divide && m->memMag.size() == m->mag.size();
    for (std::size_t i = 0; i < n; ++i) {
        const double mag = m->mag[i] - (divided ? m->memMag[i] : 0.0f);
        double phase = m->phase[i] - (divided ? m->memPhase[i] : 0.0f);
        const double wrapped = std::remainder(phase, 360.0);
        const double linear = std::pow(10.0, mag / 20.0);
        const double radians = wrapped * M_PI / 180.0;
        double value = 0.0;
        switch (formatCode) {
            case 0:
                value = linear;
                break;
            case 1:
                value = mag;
                break;
            case 2:
                value = wrapped;
                break;
            case 5:
                value = 0.0;
                break;  // the model has no group delay
            case 6:
                value = linear * std::cos(radians);
                break;
            case 7:
                value = linear * std::sin(radians);
                break;
            case 9:
                value = phase;
                break;
            case 14:
                value = wrapped < 0 ? wrapped + 360.0 : wrapped;
                break;
            default:
                return badArgument;
        }
        destination[i] = static_cast<float>(value);
    }
    points = static_cast<long>(n);
    return 0;
}

// ---------------------------------------------------------------- measurements

MeasurementState* Instrument::selectedMeasurement() {
    return measurementById(m_selectedId);
}

MeasurementState* Instrument::measurementById(int id) {
    for (auto& m : m_measurements) {
        if (m.id == id) {
            return &m;
        }
    }
    return nullptr;
}

MeasurementState& Instrument::measurementNamed(const std::string& name) {
    for (auto& m : m_measurements) {
        if (m.name == name) {
            return m;
        }
    }
    throw scpi::Error{-224, "Illegal parameter value; no measurement named \"" + name + "\""};
}

std::string Instrument::parsePortText(const std::string& text) const {
    std::string digits;
    for (char c : text) {
        if (std::isdigit(static_cast<unsigned char>(c))) {
            digits += c;
        }
    }
    return digits;
}

MeasurementState& Instrument::defineMeasurement(const std::string& name,
                                                const std::string& parameter) {
    for (const auto& m : m_measurements) {
        if (m.name == name) {
            throw scpi::Error{-200, "Execution error; measurement \"" + name + "\" exists"};
        }
    }
    if (name.empty()) {
        throw scpi::Error{-224, "Illegal parameter value; empty measurement name"};
    }
    MeasurementState m;
    m.name = name;
    m.parameter = parameter;
    std::string what = platform::upperCased(parameter.substr(0, parameter.find(',')));
    auto bad = [&] {
        return scpi::Error{-224,
                           "Illegal parameter value; unknown parameter \"" + parameter + "\""};
    };
    if (parameter.find(',') != std::string::npos) {
        std::string digits = parsePortText(parameter.substr(parameter.find(',') + 1));
        if (digits.empty() || digits.size() > 2) {
            throw bad();
        }
        m.sourcePort = std::stoi(digits);
    }
    auto slash = what.find('/');
    if (slash != std::string::npos) {
        m.numerator = what.substr(0, slash);
        m.denominator = what.substr(slash + 1);
        if (!m_scenario.hasReceiver(m.numerator) || !m_scenario.hasReceiver(m.denominator)) {
            throw bad();
        }
    } else if (what.size() == 3 && what[0] == 'S' &&
               std::isdigit(static_cast<unsigned char>(what[1])) &&
               std::isdigit(static_cast<unsigned char>(what[2]))) {
        m.sParameter = true;
        m.numerator = what;
        m.sourcePort = what[2] - '0';
        if (what[1] - '0' < 1 || what[1] - '0' > m_scenario.portCount) {
            throw bad();
        }
    } else if (m_scenario.hasReceiver(what)) {
        m.numerator = what;
    } else {
        throw bad();
    }
    if (m.sourcePort < 1 || m.sourcePort > m_scenario.portCount) {
        throw bad();
    }
    m.id = m_nextMeasurementId++;
    m_measurements.push_back(std::move(m));
    m_selectedId = m_measurements.back().id;
    return m_measurements.back();
}

void Instrument::deleteMeasurement(const std::string& name) {
    auto it = std::find_if(m_measurements.begin(), m_measurements.end(),
                           [&](const MeasurementState& m) { return m.name == name; });
    if (it == m_measurements.end()) {
        throw scpi::Error{-224, "Illegal parameter value; no measurement named \"" + name + "\""};
    }
    const int id = it->id;
    m_measurements.erase(it);
    std::erase_if(m_traceFeeds, [&](const auto& feed) { return feed.second == name; });
    if (m_selectedId == id) {
        m_selectedId = m_measurements.empty() ? 0 : m_measurements.back().id;
    }
}

// ---------------------------------------------------------------- bench

void Instrument::cableReceivers(const std::vector<Cable>& cables) {
    std::lock_guard lock(m_mutex);
    cableReceiversHeld(cables);
}

void Instrument::cableReceiversHeld(const std::vector<Cable>& cables) {
    for (auto& [name, bench] : m_bench) {
        bench.cabled = false;
    }
    for (const auto& cable : cables) {
        auto it = m_bench.find(cable.receiver);
        if (it == m_bench.end()) {
            continue;
        }
        BenchState& bench = it->second;
        bench.cabled = true;
        bench.instructedPadDb = cable.padDb;
        bench.connection = {cable.port, cable.padDb};
        auto wrong = m_scenario.faults.wrongPadDb.find(cable.receiver);
        if (wrong != m_scenario.faults.wrongPadDb.end() && !bench.padRechecked) {
            bench.connection.lossDb = wrong->second;
        }
        std::string text = "bench: " + cable.receiver + " cabled to port " +
                           std::to_string(cable.port) + " through " +
                           std::to_string(bench.connection.lossDb) + " dB";
        m_transcript.record('#', text);
    }
    for (auto& [name, bench] : m_bench) {
        if (!bench.cabled) {
            bench.connection = Connection{};
        }
    }
}

void Instrument::operatorRecheckedConnection(const std::string& receiver) {
    std::lock_guard lock(m_mutex);
    operatorRecheckedConnectionHeld(receiver);
}

void Instrument::operatorRecheckedConnectionHeld(const std::string& receiver) {
    auto it = m_bench.find(receiver);
    if (it != m_bench.end() && it->second.disconnectedLeft > 0) {
        --it->second.disconnectedLeft;
        m_transcript.record('#', "bench: operator rechecked the connection of " + receiver);
    }
}

void Instrument::operatorRecheckedPad(const std::string& receiver) {
    std::lock_guard lock(m_mutex);
    operatorRecheckedPadHeld(receiver);
}

void Instrument::operatorRecheckedPadHeld(const std::string& receiver) {
    auto it = m_bench.find(receiver);
    if (it != m_bench.end() && m_scenario.faults.wrongPadDb.count(receiver) &&
        !it->second.padRechecked) {
        it->second.padRechecked = true;
        if (it->second.cabled) {
            it->second.connection.lossDb = it->second.instructedPadDb;
        }
        m_transcript.record('#', "bench: operator fitted the instructed pad on " + receiver);
    }
}

void Instrument::operatorSawBadData(const std::string& receiver) {
    std::lock_guard lock(m_mutex);
    operatorSawBadDataHeld(receiver);
}

void Instrument::operatorSawBadDataHeld(const std::string& receiver) {
    auto it = m_bench.find(receiver);
    if (it != m_bench.end() && it->second.badDataLeft > 0) {
        --it->second.badDataLeft;
        m_transcript.record('#', "bench: operator reseated the connector of " + receiver);
    }
}

Connection Instrument::connectionOf(const std::string& receiver) const {
    std::lock_guard lock(m_mutex);
    auto it = m_bench.find(receiver);
    return it == m_bench.end() ? Connection{} : it->second.connection;
}

}  // namespace sim
