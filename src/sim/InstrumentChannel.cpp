// The channel: sweep, stimulus, source, segment table and averaging, with their SCPI
// commands.

#include <algorithm>

#include "sim/CommandText.h"
#include "sim/Instrument.h"

namespace sim {
namespace {

std::string hz(double value) {
    return nr3(value) + " Hz";
}

// Sweep types, modes and trigger settings by their SCPI words (short form first).
template <class T>
struct Word {
    const char* shortForm;
    const char* longForm;
    T value;
};

constexpr Word<SweepType> sweepTypes[] = {{"LIN", "LINEAR", SweepType::Linear},
                                          {"POW", "POWER", SweepType::Power},
                                          {"CW", "CW", SweepType::Cw},
                                          {"SEGM", "SEGMENT", SweepType::Segment}};
constexpr Word<SweepMode> sweepModes[] = {{"HOLD", "HOLD", SweepMode::Hold},
                                          {"CONT", "CONTINUOUS", SweepMode::Continuous},
                                          {"SING", "SINGLE", SweepMode::Single}};
constexpr Word<TriggerSource> triggerSources[] = {{"IMM", "IMMEDIATE", TriggerSource::Immediate},
                                                  {"MAN", "MANUAL", TriggerSource::Manual},
                                                  {"EXT", "EXTERNAL", TriggerSource::External}};
constexpr Word<ChannelTrigger> channelTriggers[] = {{"CHAN", "CHANNEL", ChannelTrigger::Channel},
                                                    {"SWE", "SWEEP", ChannelTrigger::Sweep},
                                                    {"POIN", "POINT", ChannelTrigger::Point},
                                                    {"TRAC", "TRACE", ChannelTrigger::Trace}};

template <class T, std::size_t N>
T fromWord(const Word<T> (&words)[N], const std::string& word, const char* what) {
    for (const auto& w : words) {
        if (word == w.shortForm || word == w.longForm) {
            return w.value;
        }
    }
    throw scpi::Error{-224, std::string("Illegal parameter value; ") + what + " " + word};
}

template <class T, std::size_t N>
std::string toWord(const Word<T> (&words)[N], T value) {
    for (const auto& w : words) {
        if (w.value == value) {
            return w.shortForm;
        }
    }
    return "";
}

}  // namespace

// ---------------------------------------------------------------- handlers

void Instrument::setSweepMode(SweepMode mode) {
    // Each sweep is instant; a single sweep ends in HOLD at once, and each switch to
    // continuous takes one sweep, so that readings always follow the last settings.
    if (mode != SweepMode::Hold) {
        initiate();
    }
    m_channel.sweepMode = mode == SweepMode::Single ? SweepMode::Hold : mode;
}

void Instrument::setPoints(long points) {
    if (points < 1 || points > maxPoints) {
        throw scpi::Error{-222, "Data out of range; " + std::to_string(points) +
                                    " points is outside 1 to " + std::to_string(maxPoints)};
    }
    m_channel.points = points;
}

double Instrument::startFrequency() const {
    const ChannelState& c = m_channel;
    if (c.sweepType == SweepType::Power || c.sweepType == SweepType::Cw) {
        return c.cwHz;
    }
    if (c.sweepType == SweepType::Segment && !c.segments.empty()) {
        return c.segments.front().start;
    }
    return c.startHz;
}

double Instrument::stopFrequency() const {
    const ChannelState& c = m_channel;
    if (c.sweepType == SweepType::Power || c.sweepType == SweepType::Cw) {
        return c.cwHz;
    }
    if (c.sweepType == SweepType::Segment && !c.segments.empty()) {
        return c.segments.back().stop;
    }
    return c.stopHz;
}

namespace {

void checkFrequency(double hz, const char* what) {
    if (!(hz >= 0 && hz <= 1e12)) {
        throw scpi::Error{-222, std::string("Data out of range; ") + what + " " + nr3(hz) + " Hz"};
    }
}

void checkPower(double dbm, const char* what) {
    if (!(dbm >= -90.0 && dbm <= 20.0)) {
        throw scpi::Error{-222, std::string("Data out of range; ") + what + " " + nr3(dbm) +
                                    " dBm is outside -90 to 20 dBm"};
    }
}

}  // namespace

void Instrument::setStartFrequency(double hz) {
    checkFrequency(hz, "start frequency");
    m_channel.startHz = hz;
    m_channel.stopHz = std::max(m_channel.stopHz, hz);
}

void Instrument::setStopFrequency(double hz) {
    checkFrequency(hz, "stop frequency");
    m_channel.stopHz = hz;
    m_channel.startHz = std::min(m_channel.startHz, hz);
}

void Instrument::setCwFrequency(double hz) {
    checkFrequency(hz, "CW frequency");
    m_channel.cwHz = hz;
}

void Instrument::setIfBandwidth(double hz) {
    if (!(hz > 0 && hz <= 15e6)) {
        throw scpi::Error{
            -222, "Data out of range; IF bandwidth " + nr3(hz) + " Hz is outside 0 to 15 MHz"};
    }
    m_channel.ifBandwidthHz = hz;
}

void Instrument::setStartPower(double dbm) {
    checkPower(dbm, "start power");
    m_channel.startPowerDbm = dbm;
}

void Instrument::setStopPower(double dbm) {
    checkPower(dbm, "stop power");
    m_channel.stopPowerDbm = dbm;
}

void Instrument::setAttenuatorAuto(int port, bool automatic) {
    if (port < 1 || port > m_scenario.portCount) {
        throw scpi::Error{-114, "Header suffix out of range; no port " + std::to_string(port)};
    }
    m_channel.attenuatorAuto[port] = automatic;
}

bool Instrument::attenuatorAuto(int port) const {
    auto it = m_channel.attenuatorAuto.find(port);
    return it == m_channel.attenuatorAuto.end() || it->second;
}

std::vector<double> Instrument::stimulusValues() const {
    return m_channel.sweepType == SweepType::Power ? pointPowers(1) : pointFrequencies();
}

void Instrument::writeSegments(std::vector<automation::SegmentRow> rows) {
    long total = 0;
    for (std::size_t i = 0; i < rows.size(); ++i) {
        const auto& row = rows[i];
        const std::string where = "Data out of range; segment " + std::to_string(i + 1) + ": ";
        if (!(row.points >= 1) ||
            row.points != static_cast<double>(static_cast<long>(row.points))) {
            throw scpi::Error{-222, where + "points must be a whole number of at least 1, not " +
                                        nr3(row.points)};
        }
        if (!(row.start >= 0) || !(row.stop >= row.start)) {
            throw scpi::Error{-222, where + "start " + hz(row.start) + " and stop " + hz(row.stop) +
                                        " do not form a range"};
        }
        if (!(row.ifBandwidth > 0)) {
            throw scpi::Error{-222,
                              where + "IF bandwidth must be positive, not " + nr3(row.ifBandwidth)};
        }
        if (!(row.power >= -90.0 && row.power <= 20.0)) {
            throw scpi::Error{-222,
                              where + "power " + nr3(row.power) + " dBm is outside -90 to 20 dBm"};
        }
        if (row.on != 0) {
            total += static_cast<long>(row.points);
        }
    }
    if (total > maxPoints) {
        throw scpi::Error{-222, "Data out of range; " + std::to_string(total) +
                                    " points exceed the " + std::to_string(maxPoints) +
                                    " the analyzer sweeps"};
    }
    m_channel.segments = std::move(rows);
}

// ---------------------------------------------------------------- SCPI

void Instrument::addChannelCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;
    auto none = [](auto&& f) {
        return [f](C& c) {
            f(c);
            return std::string();
        };
    };

    // Sweep.
    t.add("SENSe#:SWEep:TYPE", none([this](C& c) {
              requireChannel(c);
              setSweepType(fromWord(sweepTypes, c.parameters.word(), "sweep type"));
          }));
    t.add("SENSe#:SWEep:TYPE?", [this](C& c) {
        requireChannel(c);
        return toWord(sweepTypes, m_channel.sweepType);
    });
    t.add("SENSe#:SWEep:MODE", none([this](C& c) {
              requireChannel(c);
              setSweepMode(fromWord(sweepModes, c.parameters.word(), "sweep mode"));
          }));
    t.add("SENSe#:SWEep:MODE?", [this](C& c) {
        requireChannel(c);
        return toWord(sweepModes, m_channel.sweepMode);
    });
    t.add("SENSe#:SWEep:POINts", none([this](C& c) {
              requireChannel(c);
              const double points = c.parameters.number();
              setPoints(integerIn(points, 1, static_cast<int>(maxPoints)));
          }));
    t.add("SENSe#:SWEep:POINts?", [this](C& c) {
        requireChannel(c);
        return std::to_string(sweepPoints());
    });
    t.add("SENSe#:SWEep:TRIGger:MODE", none([this](C& c) {
              requireChannel(c);
              setChannelTrigger(fromWord(channelTriggers, c.parameters.word(), "trigger mode"));
          }));
    t.add("SENSe#:SWEep:TRIGger:MODE?", [this](C& c) {
        requireChannel(c);
        return toWord(channelTriggers, m_channel.trigger);
    });
    t.add("TRIGger:[SEQuence]:SOURce", none([this](C& c) {
              setTriggerSource(fromWord(triggerSources, c.parameters.word(), "trigger source"));
          }));
    t.add("TRIGger:[SEQuence]:SOURce?",
          [this](C&) { return toWord(triggerSources, m_triggerSource); });
    t.add("INITiate#:[IMMediate]", none([this](C& c) {
              requireChannel(c);
              initiate();
          }));
    t.add("SENSe#:SWEep:LFEXtension:STATe", none([this](C& c) {
              requireChannel(c);
              m_lowFrequencyExtension = c.parameters.boolean();
          }));
    t.add("SENSe#:SWEep:LFEXtension:STATe?",
          [this](C&) { return boolText(m_lowFrequencyExtension); });
    t.add("SYSTem:ACTive:CHANnel?", [](C&) { return std::string("1"); });

    // Stimulus.
    t.add("SENSe#:FREQuency:STARt", none([this](C& c) {
              requireChannel(c);
              setStartFrequency(c.parameters.number());
          }));
    t.add("SENSe#:FREQuency:STARt?", [this](C& c) {
        requireChannel(c);
        return nr3(startFrequency());
    });
    t.add("SENSe#:FREQuency:STOP", none([this](C& c) {
              requireChannel(c);
              setStopFrequency(c.parameters.number());
          }));
    t.add("SENSe#:FREQuency:STOP?", [this](C& c) {
        requireChannel(c);
        return nr3(stopFrequency());
    });
    t.add("SENSe#:FREQuency:CW", none([this](C& c) {
              requireChannel(c);
              setCwFrequency(c.parameters.number());
          }));
    t.add("SENSe#:FREQuency:CW?", [this](C& c) {
        requireChannel(c);
        return nr3(m_channel.cwHz);
    });
    t.add("SENSe#:BWIDth:[RESolution]", none([this](C& c) {
              requireChannel(c);
              setIfBandwidth(c.parameters.number());
          }));
    t.add("SENSe#:BWIDth:[RESolution]?", [this](C& c) {
        requireChannel(c);
        return nr3(m_channel.ifBandwidthHz);
    });
    t.add("SENSe#:BWIDth:TRACk", none([this](C& c) {
              requireChannel(c);
              setIfBandwidthTracking(c.parameters.boolean());
          }));
    t.add("SENSe#:BWIDth:TRACk?", [this](C& c) {
        requireChannel(c);
        return boolText(m_channel.ifBandwidthTracking);
    });
    t.add("SENSe#:X:[VALues]?", [this](C& c) {
        requireChannel(c);
        std::string reply;
        appendValues(reply, stimulusValues());
        return reply;
    });

    // Source: power sweep, port power and attenuators. A port comes from the header's
    // suffix (SOUR:POW2) or from a "PORT n" parameter.
    auto portOf = [this](C& c) {
        int port = c.suffix(1);
        if (!c.parameters.atEnd()) {
            std::string text = c.parameters.string();
            std::string digits = parsePortText(text);
            if (digits.empty() || digits.size() > 2 ||
                scpi::upperCased(text).find("PORT") == std::string::npos) {
                throw scpi::Error{-224, "Illegal parameter value; no source port \"" + text + "\""};
            }
            port = std::stoi(digits);
        }
        if (port < 1 || port > m_scenario.portCount) {
            throw scpi::Error{-222, "Data out of range; port " + std::to_string(port)};
        }
        return port;
    };
    t.add("SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude]", none([this, portOf](C& c) {
              requireChannel(c);
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
          }));
    t.add("SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude]?", [this, portOf](C& c) {
        requireChannel(c);
        return nr3(sourcePowerDbm(portOf(c)));
    });
    t.add("SOURce#:POWer#:COUPle", none([this](C& c) {
              requireChannel(c);
              m_powerCoupled = c.parameters.boolean();
          }));
    t.add("SOURce#:POWer#:COUPle?", [this](C&) { return boolText(m_powerCoupled); });
    t.add("SOURce#:POWer#:STARt", none([this](C& c) {
              requireChannel(c);
              setStartPower(c.parameters.number());
          }));
    t.add("SOURce#:POWer#:STARt?", [this](C& c) {
        requireChannel(c);
        return nr3(m_channel.startPowerDbm);
    });
    t.add("SOURce#:POWer#:STOP", none([this](C& c) {
              requireChannel(c);
              setStopPower(c.parameters.number());
          }));
    t.add("SOURce#:POWer#:STOP?", [this](C& c) {
        requireChannel(c);
        return nr3(m_channel.stopPowerDbm);
    });
    t.add("SOURce#:POWer#:ATTenuation:AUTO", none([this](C& c) {
              requireChannel(c);
              setAttenuatorAuto(c.suffix(1), c.parameters.boolean());
          }));
    t.add("SOURce#:POWer#:ATTenuation:AUTO?", [this](C& c) {
        requireChannel(c);
        if (c.suffix(1) < 1 || c.suffix(1) > m_scenario.portCount) {
            throw scpi::Error{-114,
                              "Header suffix out of range; no port " + std::to_string(c.suffix(1))};
        }
        return boolText(attenuatorAuto(c.suffix(1)));
    });

    // Segment table: SSTOP,<count>, then per segment state,points,start,stop,IFBW,dwell,power.
    t.add("SENSe#:SEGMent:LIST", none([this](C& c) {
              requireChannel(c);
              if (c.parameters.word() != "SSTOP") {
                  throw scpi::Error{-224,
                                    "Illegal parameter value; segment list type, SSTOP expected"};
              }
              const double count = c.parameters.number();
              const int n = integerIn(count, 0, static_cast<int>(maxPoints));
              std::vector<automation::SegmentRow> rows(static_cast<std::size_t>(n));
              for (auto& row : rows) {
                  for (double* field : {&row.on, &row.points, &row.start, &row.stop,
                                        &row.ifBandwidth, &row.reserved, &row.power}) {
                      *field = c.parameters.number();
                  }
              }
              writeSegments(std::move(rows));
          }));
    t.add("SENSe#:SEGMent:LIST?", [this](C& c) {
        requireChannel(c);
        if (c.parameters.word() != "SSTOP") {
            throw scpi::Error{-224, "Illegal parameter value; segment list type, SSTOP expected"};
        }
        std::vector<double> values;
        values.reserve(1 + 7 * m_channel.segments.size());
        values.push_back(static_cast<double>(m_channel.segments.size()));
        for (const auto& row : m_channel.segments) {
            values.insert(values.end(), {row.on, row.points, row.start, row.stop, row.ifBandwidth,
                                         row.reserved, row.power});
        }
        std::string reply;
        appendValues(reply, values);
        return reply;
    });
    t.add("SENSe#:SEGMent:DELete:ALL", none([this](C& c) {
              requireChannel(c);
              writeSegments({});
          }));
    t.add("SENSe#:SEGMent:COUNt?", [this](C& c) {
        requireChannel(c);
        return std::to_string(m_channel.segments.size());
    });
    t.add("SENSe#:SEGMent:BWIDth:[RESolution]:CONTrol", none([this](C& c) {
              requireChannel(c);
              setPerSegmentBandwidth(c.parameters.boolean());
          }));
    t.add("SENSe#:SEGMent:BWIDth:[RESolution]:CONTrol?",
          [this](C&) { return boolText(m_channel.perSegmentBandwidth); });
    t.add("SENSe#:SEGMent:POWer:[LEVel]:CONTrol", none([this](C& c) {
              requireChannel(c);
              setPerSegmentPower(c.parameters.boolean());
          }));
    t.add("SENSe#:SEGMent:POWer:[LEVel]:CONTrol?",
          [this](C&) { return boolText(m_channel.perSegmentPower); });

    // Averaging.
    auto restartAverages = [this] {
        for (auto& m : m_measurements) {
            m.averaged = 0;
        }
    };
    t.add("SENSe#:AVERage:[STATe]", none([this, restartAverages](C& c) {
              requireChannel(c);
              bool on = c.parameters.boolean();
              if (on != m_channel.averaging) {
                  restartAverages();
              }
              m_channel.averaging = on;
          }));
    t.add("SENSe#:AVERage:[STATe]?", [this](C&) { return boolText(m_channel.averaging); });
    t.add("SENSe#:AVERage:CLEar", none([restartAverages](C& c) {
              requireChannel(c);
              restartAverages();
          }));
    t.add("SENSe#:AVERage:COUNt", none([this](C& c) {
              requireChannel(c);
              m_channel.averageCount = integerIn(c.parameters.number(), 1, 65536);
          }));
    t.add("SENSe#:AVERage:COUNt?", [this](C&) { return std::to_string(m_channel.averageCount); });
}

}  // namespace sim
