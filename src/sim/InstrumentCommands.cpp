// How the simulated instrument reads SCPI, and its system, path, diagnostic and flash
// commands. The other commands live beside the state they change.

#include <charconv>
#include <ctime>

#include "sim/CommandText.h"
#include "sim/Instrument.h"

namespace sim {
namespace {

bool startsWithNoCase(std::string_view text, std::string_view prefix) {
    return text.size() >= prefix.size() &&
           scpi::upperCased(text.substr(0, prefix.size())) == scpi::upperCased(prefix);
}

bool rootedHeader(std::string_view unit) {
    std::size_t i = unit.find_first_not_of(" \t\r\n");
    return i != std::string_view::npos && unit[i] == ':';
}

}  // namespace

std::string Instrument::parse(unsigned generation, std::string_view message) {
    std::unique_lock lock(m_mutex);
    HeldLock held(*this, lock);
    m_transcript.record('>', message);
    checkGeneration(generation, "SCPI parse");
    return runMessage(message);
}

std::string Instrument::execute(std::string_view message) {
    std::unique_lock lock(m_mutex);
    HeldLock held(*this, lock);
    m_transcript.record('>', message);
    bool answered = false;
    std::string reply = runMessage(message, &answered);
    // A network client waits for one response to every query; an empty reply must still
    // reach it, and an empty line cannot be told from no response on a raw socket.
    return reply.empty() && answered ? std::string("\"\"") : reply;
}

std::uint8_t Instrument::statusByte(bool messageAvailable) {
    std::lock_guard lock(m_mutex);
    return m_status.statusByte(!m_errors.empty(), messageAvailable);
}

void Instrument::reportError(int code, const std::string& message) {
    std::lock_guard lock(m_mutex);
    queueError(code, message);
}

std::string Instrument::runMessage(std::string_view message, bool* answeredQuery) {
    std::string reply;
    bool first = true;
    std::vector<std::string> path;
    for (std::string_view unit : scpi::splitMessageUnits(message)) {
        std::string part;
        try {
            scpi::CommandHeader header = scpi::parseHeader(unit);
            scpi::ParameterReader parameters(header.parameters);
            part = m_commands.dispatch(header, rootedHeader(unit), path, parameters);
            parameters.finish();
            if (header.query && answeredQuery) {
                *answeredQuery = true;
            }
        } catch (const scpi::Error& error) {
            queueError(error.code, error.message);
            part.clear();
        }
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

void Instrument::queueError(int code, const std::string& message) {
    m_errors.push(code, message);
    m_status.recordError(code);
    m_transcript.record('!', std::to_string(code) + ",\"" + message + "\"");
}

void Instrument::applyErrorRules(std::string_view unit) {
    const auto& rules = m_scenario.faults.scpiErrors;
    for (std::size_t i = 0; i < rules.size(); ++i) {
        if (m_errorRuleUses[i] < rules[i].times && startsWithNoCase(unit, rules[i].command)) {
            ++m_errorRuleUses[i];
            for (const auto& error : rules[i].errors) {
                m_errors.pushText(error);
                m_status.recordError(std::atoi(error.c_str()));
                m_transcript.record('!', error);
            }
        }
    }
}

void Instrument::buildCommands() {
    addCommonCommands();
    addChannelCommands();
    addMeasurementCommands();
    addFileCommands();
    addDiagnosticCommands();
    addBenchCommands();
}

void Instrument::addDiagnosticCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;

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

    // Receiver paths.
    t.add("SENSe#:PATH:CONFig:ELEMent:[STATe]", [this](C& c) {
        std::string element = scpi::upperCased(c.parameters.string());
        std::string value = scpi::upperCased(c.parameters.string());
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
        std::string element = scpi::upperCased(c.parameters.string());
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
        std::string value = scpi::upperCased(c.parameters.string());
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
        auto fault = m_corruptFlashWritesLeft.find(scpi::upperCased(name));
        if (fault != m_corruptFlashWritesLeft.end() && fault->second > 0 && !words.empty()) {
            --fault->second;
            words[words.size() / 2] ^= 0x0100;
            m_transcript.record('#', "flash: stored word " + std::to_string(words.size() / 2) +
                                         " of " + name + " wrong");
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
