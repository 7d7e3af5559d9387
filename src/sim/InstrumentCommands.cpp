// The SCPI command set of the simulated instrument.

#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <ctime>
#include <numeric>

#include "platform/UpperCase.h"
#include "sim/Instrument.h"

namespace sim {
namespace {

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    if (text.size() < prefix.size()) {
        return false;
    }
    for (std::size_t i = 0; i < prefix.size(); ++i) {
        if (std::toupper(static_cast<unsigned char>(text[i])) !=
            std::toupper(static_cast<unsigned char>(prefix[i]))) {
            return false;
        }
    }
    return true;
}

// Numbers in replies as the analyzer writes them (NR3, 12 significant digits).
std::string nr3(double value) {
    char buffer[40];
    std::snprintf(buffer, sizeof buffer, "%+.11E", value);
    return buffer;
}

std::string inQuotes(const std::string& text) {
    return "\"" + text + "\"";
}

int integerIn(double value, int low, int high) {
    if (!(value >= low && value <= high) || std::floor(value) != value) {
        throw scpi::Error{-222, "Data out of range"};
    }
    return static_cast<int>(value);
}

}  // namespace

std::string Instrument::parse(unsigned generation, const std::string& command) {
    std::lock_guard lock(m_mutex);
    m_transcript.record('>', command);
    checkGeneration(generation, "SCPI parse");
    std::string reply;
    bool first = true;
    for (std::string_view unit : scpi::splitMessageUnits(command)) {
        std::string part = executeUnit(unit);
        applyErrorRules(unit);
        if (!part.empty()) {
            reply += first ? "" : ";";
            reply += part;
            first = false;
        }
    }
    if (!reply.empty()) {
        m_transcript.record('<', reply);
    }
    return reply;
}

std::string Instrument::executeUnit(std::string_view unit) {
    try {
        scpi::CommandHeader header = scpi::parseHeader(unit);
        scpi::ParameterReader parameters(header.parameters);
        std::string reply = m_commands.dispatch(header, parameters);
        parameters.finish();
        return reply;
    } catch (const scpi::Error& error) {
        m_errors.push(error.code, error.message);
        m_transcript.record('!', std::to_string(error.code) + ",\"" + error.message + "\"");
        return "";
    }
}

void Instrument::applyErrorRules(std::string_view unit) {
    const auto& rules = m_scenario.faults.scpiErrors;
    for (std::size_t i = 0; i < rules.size(); ++i) {
        if (m_errorRuleUses[i] < rules[i].times && startsWithNoCase(unit, rules[i].command)) {
            ++m_errorRuleUses[i];
            for (const auto& error : rules[i].errors) {
                m_errors.pushText(error);
                m_transcript.record('!', error);
            }
        }
    }
}

void Instrument::buildCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;

    // Identification and status.
    t.add("*IDN?", [this](C&) { return m_scenario.idn; });
    t.add("*OPT?", [this](C&) { return inQuotes(m_scenario.options); });
    t.add("*RST", [this](C&) {
        preset();
        return std::string();
    });
    t.add("*CLS", [this](C&) {
        m_errors.clear();
        return std::string();
    });
    t.add("*OPC?", [](C&) { return std::string("1"); });
    t.add("SYSTem:ERRor:[NEXT]?", [this](C&) { return m_errors.pop(); });
    t.add("SYSTem:ERRor:COUNt?", [this](C&) { return std::to_string(m_errors.size()); });
    t.add("SYSTem:PRESet", [this](C&) {
        preset();
        return std::string();
    });
    t.add("SYSTem:CONFigure:MWAVe:CONFiguration:CATalog?",
          [this](C&) { return inQuotes(m_scenario.mmwaveCatalog); });
    t.add("SYSTem:CONFigure:MWAVe:CONFiguration:ACTive?",
          [this](C&) { return inQuotes(m_scenario.mmwaveActive); });
    t.add("SYSTem:CONFigure:DIRectory?", [this](C& c) {
        std::string which = c.parameters.word();
        if (which == "APPLICATION" || which == "APPL") {
            return inQuotes(m_scenario.appDir);
        }
        if (which == "CONFIGURATION" || which == "CONF") {
            return inQuotes("C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations");
        }
        throw scpi::Error{-224, "Illegal parameter value; no directory " + which};
    });
    t.add("DIAGnostic:PORTCOUNT?", [this](C&) { return std::to_string(m_scenario.portCount); });

    // Source power of a port: SOUR:POW <dBm>[,"PORT n"].
    auto portOf = [this](C& c) {
        int port = 1;
        if (!c.parameters.atEnd()) {
            std::string text = c.parameters.string();
            std::string digits = parsePortText(text);
            if (digits.empty() || digits.size() > 2 ||
                platform::upperCased(text).find("PORT") == std::string::npos) {
                throw scpi::Error{-224, "Illegal parameter value; no source port \"" + text + "\""};
            }
            port = std::stoi(digits);
        }
        if (port < 1 || port > m_scenario.portCount) {
            throw scpi::Error{-222, "Data out of range; port " + std::to_string(port)};
        }
        return port;
    };
    t.add("SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude]", [this, portOf](C& c) {
        double power = c.parameters.number();
        int port = portOf(c);
        if (power < -90.0 || power > 20.0) {
            throw scpi::Error{-222, "Data out of range; source power -90 to 20 dBm"};
        }
        // Port powers are coupled, as after a preset: one level for every port.
        if (m_powerCoupled) {
            for (int p = 1; p <= m_scenario.portCount; ++p) {
                m_sourcePower[p] = power;
            }
        } else {
            m_sourcePower[port] = power;
        }
        return std::string();
    });
    t.add("SOURce#:POWer#:COUPle", [this](C& c) {
        m_powerCoupled = c.parameters.boolean();
        return std::string();
    });
    t.add("SOURce#:POWer#:COUPle?", [this](C&) { return std::string(m_powerCoupled ? "1" : "0"); });
    t.add("SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude]?",
          [this, portOf](C& c) { return nr3(sourcePowerDbm(portOf(c))); });

    // Measurements.
    t.add("CALCulate#:PARameter:DELete", [this](C& c) {
        deleteMeasurement(c.parameters.string());
        return std::string();
    });
    t.add("CALCulate#:PARameter:DELete:ALL", [this](C&) {
        m_measurements.clear();
        m_traceFeeds.clear();
        m_selectedId = 0;
        return std::string();
    });
    t.add("CALCulate#:PARameter:DEFine:EXTended", [this](C& c) {
        std::string name = c.parameters.string();
        std::string parameter = c.parameters.string();
        defineMeasurement(name, parameter);
        return std::string();
    });
    t.add("CALCulate#:PARameter:SELect", [this](C& c) {
        m_selectedId = measurementNamed(c.parameters.string()).id;
        return std::string();
    });
    t.add("CALCulate#:PARameter:SELect?", [this](C&) {
        MeasurementState* m = selectedMeasurement();
        return inQuotes(m ? m->name : "");
    });
    t.add("CALCulate#:PARameter:CATalog:[EXTended]?", [this](C&) {
        std::string list;
        for (const auto& m : m_measurements) {
            list += (list.empty() ? "" : ",") + m.name + "," + m.parameter;
        }
        return inQuotes(list);
    });
    auto selected = [this]() -> MeasurementState& {
        MeasurementState* m = selectedMeasurement();
        if (!m) {
            throw scpi::Error{-221, "Settings conflict; no measurement selected"};
        }
        return *m;
    };
    t.add("CALCulate#:FUNCtion:STATe", [this](C& c) {
        m_statistics = c.parameters.boolean();
        return std::string();
    });
    t.add("CALCulate#:FUNCtion:STATe?",
          [this](C&) { return std::string(m_statistics ? "1" : "0"); });
    t.add("CALCulate#:FUNCtion:TYPE", [this](C& c) {
        std::string type = c.parameters.word();
        if (type != "MEAN" && type != "PTP" && type != "STDEV" && type != "MIN" && type != "MAX") {
            throw scpi::Error{-224, "Illegal parameter value; statistic " + type};
        }
        m_statisticsType = type;
        return std::string();
    });
    t.add("CALCulate#:FUNCtion:DATA?", [this, selected](C&) {
        MeasurementState& m = selected();
        long points = static_cast<long>(m.mag.size());
        std::vector<float> trace(m.mag.size());
        if (readTrace(m.id, 2, 1, points, trace) != 0 || points == 0) {
            throw scpi::Error{-230, "Data corrupt or stale; no trace data"};
        }
        trace.resize(static_cast<std::size_t>(points));
        double sum = std::accumulate(trace.begin(), trace.end(), 0.0);
        double mean = sum / static_cast<double>(trace.size());
        double result = mean;
        if (m_statisticsType == "MIN" || m_statisticsType == "MAX" || m_statisticsType == "PTP") {
            auto [low, high] = std::minmax_element(trace.begin(), trace.end());
            result = m_statisticsType == "MIN"   ? *low
                     : m_statisticsType == "MAX" ? *high
                                                 : *high - *low;
        } else if (m_statisticsType == "STDEV") {
            double square = 0.0;
            for (float v : trace) {
                square += (v - mean) * (v - mean);
            }
            result = std::sqrt(square / static_cast<double>(trace.size()));
        }
        return nr3(result);
    });
    t.add("CALCulate#:MATH:MEMorize", [selected](C&) {
        MeasurementState& m = selected();
        if (!m.hasData) {
            throw scpi::Error{-200, "Execution error; no data to memorize"};
        }
        m.memMag = m.mag;
        m.memPhase = m.phase;
        return std::string();
    });
    t.add("CALCulate#:MATH:FUNCtion", [selected](C& c) {
        std::string function = c.parameters.word();
        MeasurementState& m = selected();
        if (function == "DIV" || function == "DIVIDE") {
            if (m.memMag.empty()) {
                throw scpi::Error{-221, "Settings conflict; no memory trace"};
            }
            m.divide = true;
        } else if (function == "NORM" || function == "NORMAL") {
            m.divide = false;
        } else {
            throw scpi::Error{-224, "Illegal parameter value; math function " + function};
        }
        return std::string();
    });
    t.add("CALCulate#:MATH:FUNCtion?",
          [selected](C&) { return std::string(selected().divide ? "DIV" : "NORM"); });

    // Display.
    t.add("DISPlay:WINDow#:TRACe#:FEED", [this](C& c) {
        std::string name = c.parameters.string();
        measurementNamed(name);
        m_traceFeeds[{c.suffix(0), c.suffix(1)}] = name;
        return std::string();
    });
    t.add("DISPlay:WINDow#:TRACe#:SELect", [this](C& c) {
        auto feed = m_traceFeeds.find({c.suffix(0), c.suffix(1)});
        if (feed == m_traceFeeds.end()) {
            throw scpi::Error{-221, "Settings conflict; trace " + std::to_string(c.suffix(1)) +
                                        " shows no measurement"};
        }
        m_selectedId = measurementNamed(feed->second).id;
        return std::string();
    });
    t.add("DISPlay:WINDow#:TRACe#:STATe", [](C& c) {
        c.parameters.boolean();
        return std::string();
    });
    t.add("DISPlay:WINDow#:TRACe#:Y:[SCALe]:PDIVision", [this](C& c) {
        double scale = c.parameters.number();
        if (scale <= 0.0) {
            throw scpi::Error{-222, "Data out of range; scale per division"};
        }
        m_traceScale[{c.suffix(0), c.suffix(1)}] = scale;
        return std::string();
    });
    t.add("DISPlay:WINDow#:TRACe#:Y:[SCALe]:PDIVision?", [this](C& c) {
        auto it = m_traceScale.find({c.suffix(0), c.suffix(1)});
        return nr3(it == m_traceScale.end() ? 10.0 : it->second);
    });

    // Averaging, sweep options, data format.
    t.add("SENSe#:AVERage:[STATe]", [this](C& c) {
        bool on = c.parameters.boolean();
        if (on != m_channel.averaging) {
            for (auto& m : m_measurements) {
                m.averaged = 0;
            }
        }
        m_channel.averaging = on;
        return std::string();
    });
    t.add("SENSe#:AVERage:[STATe]?",
          [this](C&) { return std::string(m_channel.averaging ? "1" : "0"); });
    t.add("SENSe#:AVERage:CLEar", [this](C&) {
        for (auto& m : m_measurements) {
            m.averaged = 0;
        }
        return std::string();
    });
    t.add("SENSe#:AVERage:COUNt", [this](C& c) {
        m_channel.averageCount = integerIn(c.parameters.number(), 1, 65536);
        return std::string();
    });
    t.add("SENSe#:AVERage:COUNt?", [this](C&) { return std::to_string(m_channel.averageCount); });
    t.add("SENSe#:SWEep:LFEXtension:STATe", [this](C& c) {
        m_lowFrequencyExtension = c.parameters.boolean();
        return std::string();
    });
    t.add("SENSe#:SWEep:LFEXtension:STATe?",
          [this](C&) { return std::string(m_lowFrequencyExtension ? "1" : "0"); });
    t.add("SENSe#:SWEep:POINts?", [this](C&) { return std::to_string(sweepPoints()); });
    t.add("FORMat:[DATA]", [this](C& c) {
        std::string format = c.parameters.word();
        if (format != "ASC" && format != "ASCII" && format != "REAL") {
            throw scpi::Error{-224, "Illegal parameter value; data format " + format};
        }
        if (!c.parameters.atEnd()) {
            c.parameters.number();
        }
        m_dataFormat = format == "ASCII" ? "ASC" : format;
        return std::string();
    });
    t.add("FORMat:[DATA]?",
          [this](C&) { return m_dataFormat + (m_dataFormat == "ASC" ? ",0" : ",32"); });

    // Receiver paths.
    t.add("SENSe#:PATH:CONFig:ELEMent:[STATe]", [this](C& c) {
        std::string element = platform::upperCased(c.parameters.string());
        std::string value = platform::upperCased(c.parameters.string());
        if (element.empty() || value.empty()) {
            throw scpi::Error{-224, "Illegal parameter value; empty path element"};
        }
        if (element == "IFSIGPATHALL" && value != "NBF" && value != "WBF") {
            throw scpi::Error{-224, "Illegal parameter value; IF path " + value};
        }
        m_pathElements[element] = value;
        return std::string();
    });
    t.add("SENSe#:PATH:CONFig:ELEMent:[STATe]?", [this](C& c) {
        std::string element = platform::upperCased(c.parameters.string());
        if (element.rfind("NBFATN", 0) == 0 && m_scenario.hasReceiver(element.substr(6))) {
            auto fault = m_scenario.faults.attenuatorReply.find(element.substr(6));
            return fault == m_scenario.faults.attenuatorReply.end() ? inQuotes("30")
                                                                    : fault->second;
        }
        auto it = m_pathElements.find(element);
        if (it == m_pathElements.end()) {
            throw scpi::Error{-224, "Illegal parameter value; no path element \"" + element + "\""};
        }
        return inQuotes(it->second);
    });

    // Hidden diagnostics.
    for (const char* state : {"RXCAL", "CMPCAL", "MXCAL"}) {
        std::string name = state;
        t.add("DIAGnostic:" + name + ":STATe", [this, name](C& c) {
            m_diagStates[name] = c.parameters.boolean();
            return std::string();
        });
        t.add("DIAGnostic:" + name + ":STATe?",
              [this, name](C&) { return std::string(m_diagStates[name] ? "1" : "0"); });
    }
    t.add("DIAGnostic:SWEEP_PARM", [](C& c) {
        c.parameters.string();
        std::string value = platform::upperCased(c.parameters.string());
        if (value != "TRUE" && value != "FALSE") {
            throw scpi::Error{-224, "Illegal parameter value; \"" + value + "\""};
        }
        return std::string();
    });
    auto twoIntegers = [](C& c) {
        integerIn(c.parameters.number(), 0, 1 << 30);
        integerIn(c.parameters.number(), -(1 << 30), 1 << 30);
        return std::string();
    };
    t.add("DIAGnostic:POKE", twoIntegers);
    t.add("DIAGnostic:POKE:LONG", twoIntegers);
    t.add("DIAGnostic:EEUPDATEHW", [](C&) { return std::string(); });
    t.add("DIAGnostic:FCAL:LOAD", [this](C&) {
        ++m_flashLoads;
        return std::string();
    });

    // Flash file store.
    t.add("DIAGnostic:FLASHARRAY", [this](C& c) {
        std::string file = c.parameters.string();
        std::string name = c.parameters.string();
        std::vector<std::uint16_t> words;
        std::uint16_t word = 0;
        while (c.parameters.nextWord(word)) {
            words.push_back(word);
        }
        m_flash.write(file, name, words, std::chrono::system_clock::now());
        return std::string();
    });
    t.add("DIAGnostic:FLASHARRAY?", [this](C& c) {
        std::string file = c.parameters.string();
        std::string name = c.parameters.string();
        auto words = m_flash.read(file, name);
        if (!words) {
            throw scpi::Error{-256, "File name not found; " + file + "\\" + name};
        }
        std::string reply;
        reply.reserve(words->size() * 6 + 1);
        char buffer[8];
        for (auto w : *words) {
            reply += ',';
            auto result = std::to_chars(buffer, buffer + sizeof buffer, w);
            reply.append(buffer, result.ptr);
        }
        return reply.empty() ? std::string(",") : reply;
    });
    t.add("DIAGnostic:FLASH:CATalog?", [this](C&) {
        std::string reply;
        for (const auto& entry : m_flash.catalog()) {
            std::time_t when = std::chrono::system_clock::to_time_t(entry.stored);
            std::tm local{};
            localtime_r(&when, &local);
            char date[32];
            std::strftime(date, sizeof date, "%m/%d/%Y %H:%M:%S", &local);
            reply += (reply.empty() ? "" : "\n") + std::string(date) + " " +
                     std::to_string(entry.words * 2) + " " + entry.file + "\\" + entry.name;
        }
        return reply;
    });
    t.add("DIAGnostic:FLASH:FILE:ERASe", [this](C& c) {
        std::string file = c.parameters.string();
        std::string name = c.parameters.string();
        if (!m_flash.erase(file, name)) {
            throw scpi::Error{-256, "File name not found; " + file + "\\" + name};
        }
        return std::string();
    });
    t.add("DIAGnostic:MM:DATA:PUSH", [this](C& c) {
        int port = integerIn(c.parameters.number(), 1, m_scenario.portCount);
        integerIn(c.parameters.number(), 0, 1);
        pushPortData(port);
        return std::string();
    });
}

}  // namespace sim
