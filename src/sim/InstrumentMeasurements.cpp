// Measurements, their memory math, statistics, display and trace data, with their SCPI
// commands.

#include <algorithm>
#include <cmath>
#include <numeric>

#include "sim/CommandText.h"
#include "sim/Instrument.h"

namespace sim {
namespace {

struct FormatWord {
    const char* shortForm;
    const char* longForm;
    TraceFormat format;
};

constexpr FormatWord traceFormats[] = {
    {"MLIN", "MLINEAR", TraceFormat::LinearMagnitude},
    {"MLOG", "MLOGARITHMIC", TraceFormat::LogMagnitude},
    {"PHAS", "PHASE", TraceFormat::Phase},
    {"GDEL", "GDELAY", TraceFormat::GroupDelay},
    {"REAL", "REAL", TraceFormat::Real},
    {"IMAG", "IMAGINARY", TraceFormat::Imaginary},
    {"UPH", "UPHASE", TraceFormat::UnwrappedPhase},
    {"PPH", "PPHASE", TraceFormat::PositivePhase},
};

TraceFormat traceFormatOf(const std::string& word) {
    for (const auto& f : traceFormats) {
        if (word == f.shortForm || word == f.longForm) {
            return f.format;
        }
    }
    throw scpi::Error{-224, "Illegal parameter value; trace format " + word};
}

std::string wordOf(TraceFormat format) {
    for (const auto& f : traceFormats) {
        if (f.format == format) {
            return f.shortForm;
        }
    }
    return "";
}

}  // namespace

// ---------------------------------------------------------------- handlers

std::vector<int> Instrument::measurementNumbers() const {
    std::vector<int> numbers;
    numbers.reserve(m_measurements.size());
    for (const auto& m : m_measurements) {
        numbers.push_back(m.id);
    }
    return numbers;
}

MeasurementState& Instrument::measurementNumbered(int number) {
    MeasurementState* m = measurementById(number);
    if (!m) {
        throw scpi::Error{
            -224, "Illegal parameter value; no measurement number " + std::to_string(number)};
    }
    return *m;
}

int Instrument::selectedMeasurementNumber() {
    MeasurementState* m = selectedMeasurement();
    return m ? m->id : 0;
}

// ---------------------------------------------------------------- SCPI

void Instrument::addMeasurementCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;

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
    t.add("CALCulate#:FUNCtion:STATe?", [this](C&) { return boolText(m_statistics); });
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

    // Measurements by number, as the automation objects hold them.
    t.add("SYSTem:MEASurement:CATalog?", [this](C&) {
        std::string list;
        for (int number : measurementNumbers()) {
            list += (list.empty() ? "" : ",") + std::to_string(number);
        }
        return inQuotes(list);
    });
    t.add("SYSTem:MEASurement#:NAME?",
          [this](C& c) { return inQuotes(measurementNumbered(c.suffix(0)).name); });
    t.add("CALCulate#:MEASure#:PARameter?",
          [this](C& c) { return inQuotes(measurementNumbered(c.suffix(1)).parameter); });
    t.add("CALCulate#:MEASure#:SETTing#", [this](C& c) {
        requireChannel(c);
        MeasurementState& m = measurementNumbered(c.suffix(1));
        const int value = integerIn(c.parameters.number(), -1000, 1000);
        if (c.suffix(2) == 1) {
            m.firstSetting = value;
        } else if (c.suffix(2) == 2) {
            m.secondSetting = value;
        } else {
            throw scpi::Error{
                -114, "Header suffix out of range; no setting " + std::to_string(c.suffix(2))};
        }
        return std::string();
    });
    t.add("CALCulate#:MEASure#:SETTing#?", [this](C& c) {
        MeasurementState& m = measurementNumbered(c.suffix(1));
        if (c.suffix(2) != 1 && c.suffix(2) != 2) {
            throw scpi::Error{
                -114, "Header suffix out of range; no setting " + std::to_string(c.suffix(2))};
        }
        return std::to_string(c.suffix(2) == 1 ? m.firstSetting : m.secondSetting);
    });
    t.add("CALCulate#:PARameter:MNUMber:[SELect]", [this](C& c) {
        requireChannel(c);
        m_selectedId = measurementNumbered(integerIn(c.parameters.number(), 1, 1 << 30)).id;
        return std::string();
    });
    t.add("CALCulate#:PARameter:MNUMber:[SELect]?",
          [this](C&) { return std::to_string(selectedMeasurementNumber()); });

    // Trace format and data: of the selected measurement, or of a numbered one without
    // changing the selection.
    t.add("CALCulate#:FORMat", [selected](C& c) {
        requireChannel(c);
        selected().format = traceFormatOf(c.parameters.word());
        return std::string();
    });
    t.add("CALCulate#:FORMat?", [selected](C&) { return wordOf(selected().format); });
    t.add("CALCulate#:MEASure#:FORMat", [this](C& c) {
        requireChannel(c);
        measurementNumbered(c.suffix(1)).format = traceFormatOf(c.parameters.word());
        return std::string();
    });
    t.add("CALCulate#:MEASure#:FORMat?",
          [this](C& c) { return wordOf(measurementNumbered(c.suffix(1)).format); });
    auto data = [this](MeasurementState& m, const std::string& which) {
        if (which != "FDATA" && which != "SDATA") {
            throw scpi::Error{
                -224, "Illegal parameter value; data " + which + ", FDATA or SDATA expected"};
        }
        auto read = [&](TraceFormat format) {
            long points = static_cast<long>(m.mag.size());
            std::vector<float> values(m.mag.size());
            if (readTrace(m.id, 2, static_cast<int>(format), points, values) != 0) {
                throw scpi::Error{
                    -230, "Data corrupt or stale; measurement \"" + m.name + "\" has no data"};
            }
            return values;
        };
        std::vector<double> values;
        if (which == "FDATA") {
            const auto trace = read(m.format);
            values.assign(trace.begin(), trace.end());
        } else {
            const auto re = read(TraceFormat::Real);
            const auto im = read(TraceFormat::Imaginary);
            values.reserve(2 * re.size());
            for (std::size_t i = 0; i < re.size(); ++i) {
                values.push_back(re[i]);
                values.push_back(im[i]);
            }
        }
        std::string reply;
        appendValues(reply, values);
        return reply;
    };
    t.add("CALCulate#:DATA?", [selected, data](C& c) {
        requireChannel(c);
        return data(selected(), c.parameters.word());
    });
    t.add("CALCulate#:MEASure#:DATA?", [this, data](C& c) {
        requireChannel(c);
        return data(measurementNumbered(c.suffix(1)), c.parameters.word());
    });

    // How trace data travels: ASCII or IEEE 754 blocks, big-endian unless swapped.
    t.add("FORMat:[DATA]", [this](C& c) {
        const std::string format = c.parameters.word();
        if (format == "ASC" || format == "ASCII") {
            if (!c.parameters.atEnd()) {
                c.parameters.number();
            }
            m_dataFormat = scpi::DataFormat::Ascii;
        } else if (format == "REAL") {
            const double bits = c.parameters.atEnd() ? 64 : c.parameters.number();
            if (bits != 32 && bits != 64) {
                throw scpi::Error{-224, "Illegal parameter value; REAL," + nr3(bits) +
                                            ", REAL,32 or REAL,64 expected"};
            }
            m_dataFormat = bits == 32 ? scpi::DataFormat::Real32 : scpi::DataFormat::Real64;
        } else {
            throw scpi::Error{-224, "Illegal parameter value; data format " + format};
        }
        return std::string();
    });
    t.add("FORMat:[DATA]?", [this](C&) {
        switch (m_dataFormat) {
            case scpi::DataFormat::Real32:
                return std::string("REAL,32");
            case scpi::DataFormat::Real64:
                return std::string("REAL,64");
            default:
                return std::string("ASC,0");
        }
    });
    t.add("FORMat:BORDer", [this](C& c) {
        const std::string order = c.parameters.word();
        if (order == "NORM" || order == "NORMAL") {
            m_byteOrder = scpi::ByteOrder::Normal;
        } else if (order == "SWAP" || order == "SWAPPED") {
            m_byteOrder = scpi::ByteOrder::Swapped;
        } else {
            throw scpi::Error{-224, "Illegal parameter value; byte order " + order};
        }
        return std::string();
    });
    t.add("FORMat:BORDer?", [this](C&) {
        return std::string(m_byteOrder == scpi::ByteOrder::Normal ? "NORM" : "SWAP");
    });
}

void Instrument::appendValues(std::string& reply, std::span<const double> values) const {
    scpi::appendValues(reply, values, m_dataFormat, m_byteOrder);
}

}  // namespace sim
