// Trace readback through the analyzer's measurement objects, addressed by name.

#include <algorithm>
#include <array>
#include <string_view>

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/UpperCase.h"

using automation::queryInterface;
using platform::upperCased;

namespace {

struct TraceFormat {
    std::string_view name;
    int code;
};

// In the order the names are tested.
constexpr std::array<TraceFormat, 8> traceFormats{{
    {"LOGMAG", 1},
    {"LINMAG", 0},
    {"PHASE", 2},
    {"PHASE UNWRAPPED", 9},
    {"PHASE POSITIVE", 14},
    {"DELAY", 5},
    {"REAL", 6},
    {"IMAGINARY", 7},
}};

// The data location every trace read uses.
constexpr int traceLocation = 2;

// The read's code for an upper-cased format name.
int formatCode(const std::string& upper) {
    const auto match = std::find_if(traceFormats.begin(), traceFormats.end(),
                                    [&](const TraceFormat& f) { return f.name == upper; });
    if (match == traceFormats.end()) {
        throw std::string("CNetworkAnalyzer::readdata " + upper + "Is not a recognized format");
    }
    return match->code;
}

}  // namespace

void CNetworkAnalyzer::refreshmeasurements() {
    auto collection =
        queryInterface<automation::MeasurementCollection>(application()->measurements());
    if (!collection) {
        throw std::string(
            "CNetworkAnalyzer::refreshmeasurements: the analyzer application offers no "
            "measurement collection");
    }
    // Rebuilt from scratch: a redefined measurement must not keep its deleted predecessor.
    clearmeasurements();
    const int count = collection->count();
    for (int i = 1; i <= count; ++i) {
        std::shared_ptr<automation::Object> item = collection->item(i);
        auto measurement = queryInterface<automation::Measurement>(item);
        auto data = queryInterface<automation::MeasurementData>(item);
        if (!measurement || !data) {
            throw std::string("CNetworkAnalyzer::refreshmeasurements: measurement " +
                              std::to_string(i) + " of " + std::to_string(count) +
                              " offers no measurement data");
        }
        const std::string name = measurement->name();
        m_measurementObjects.emplace(name, std::move(item));
        m_measurements.emplace(name, std::move(data));
    }
}

void CNetworkAnalyzer::clearmeasurements() {
    m_measurements.clear();
    m_measurementObjects.clear();
}

long CNetworkAnalyzer::readtrace(automation::MeasurementData& data, const std::string& name,
                                 const std::string& format, std::span<float> destination) {
    const int code = formatCode(format);
    const std::string what =
        "CNetworkAnalyzer::readdata " + format + " of measurement \"" + name + "\"";
    if (m_numberOfPoints < 0 || destination.size() < static_cast<std::size_t>(m_numberOfPoints)) {
        throw std::string(what + ": the buffer holds " + std::to_string(destination.size()) +
                          " values, the channel has " + std::to_string(m_numberOfPoints) +
                          " points");
    }
    const long status = data.readData(traceLocation, code, m_numberOfPoints, destination);
    if (status != 0) {
        throw std::string(what + " failed with status " + std::to_string(status));
    }
    if (m_numberOfPoints < 0 || destination.size() < static_cast<std::size_t>(m_numberOfPoints)) {
        throw std::string(what + ": the analyzer delivered " + std::to_string(m_numberOfPoints) +
                          " points, the buffer holds " + std::to_string(destination.size()));
    }
    return m_numberOfPoints;
}

long CNetworkAnalyzer::readdata(const std::string& name, const std::string& format,
                                std::span<float> destination) {
    const std::string upper = platform::upperCased(format);
    formatCode(upper);
    const auto found = m_measurements.find(name);
    if (found == m_measurements.end()) {
        throw std::string("CNetworkAnalyzer::readdata " + upper + " of measurement \"" + name +
                          "\": no such measurement among the " +
                          std::to_string(m_measurements.size()) + " last listed by the analyzer");
    }
    return readtrace(*found->second, name, upper, destination);
}

float CNetworkAnalyzer::readcurrentvalue(const std::string& format) {
    const std::string upper = platform::upperCased(format);
    formatCode(upper);
    const std::string name = currentmeasurement()->name();
    m_pCurrentMeasurementData =
        queryInterface<automation::MeasurementData>(m_pCurrentMeasurementObject);
    if (!m_pCurrentMeasurementData) {
        throw std::string("CNetworkAnalyzer::readdata " + upper + " of measurement \"" + name +
                          "\": it offers no measurement data");
    }
    std::vector<float> trace(static_cast<std::size_t>(std::max(m_numberOfPoints, 1L)));
    if (readtrace(*m_pCurrentMeasurementData, name, upper, trace) < 1) {
        throw std::string("CNetworkAnalyzer::readdata " + upper + " of measurement \"" + name +
                          "\": the analyzer delivered no points");
    }
    return trace.front();
}
