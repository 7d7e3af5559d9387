#include <algorithm>
#include <charconv>

#include "analyzer/remote/RemoteObjects.h"

namespace remote {
namespace {

// The automation's format codes and the instrument's words for them.
const char* formatWord(int code) {
    switch (code) {
        case 0:
            return "MLIN";
        case 1:
            return "MLOG";
        case 2:
            return "PHAS";
        case 5:
            return "GDEL";
        case 6:
            return "REAL";
        case 7:
            return "IMAG";
        case 9:
            return "UPH";
        case 14:
            return "PPH";
        default:
            return nullptr;
    }
}

}  // namespace

std::string RemoteMeasurement::label() const {
    return m_name.empty() ? "measurement " + std::to_string(m_number)
                          : "measurement '" + m_name + "'";
}

std::string RemoteMeasurement::name() {
    m_name = m_link->queryString("SYST:MEAS" + std::to_string(m_number) + ":NAME?",
                                 "reading the name of " + label());
    return m_name;
}

std::string RemoteMeasurement::parameter() {
    return m_link->queryString("CALC:MEAS" + std::to_string(m_number) + ":PAR?",
                               "reading the parameter of " + label());
}

void RemoteMeasurement::setFirstSetting(int value) {
    m_link->command("CALC:MEAS" + std::to_string(m_number) + ":SETT1 " + std::to_string(value),
                    "setting up " + label());
}

void RemoteMeasurement::setSecondSetting(int value) {
    m_link->command("CALC:MEAS" + std::to_string(m_number) + ":SETT2 " + std::to_string(value),
                    "setting up " + label());
}

long RemoteMeasurement::readData(int location, int formatCode, long& points,
                                 std::span<float> destination) {
    constexpr long badArgument = 0x57;  // the automation layer's "invalid argument"
    const char* word = formatWord(formatCode);
    if (location != 2 || word == nullptr) {
        return badArgument;
    }
    const std::string number = std::to_string(m_number);
    const std::vector<float> values = m_link->queryFloats(
        ":CALC:MEAS" + number + ":FORM " + word + ";:CALC:MEAS" + number + ":DATA? FDATA",
        "reading the trace of " + label());
    const std::size_t n = std::min(
        {values.size(), destination.size(), static_cast<std::size_t>(std::max(points, 0L))});
    std::copy_n(values.begin(), n, destination.begin());
    points = static_cast<long>(n);
    return 0;
}

void RemoteMeasurementCollection::list() {
    const std::string reply =
        m_link->queryString("SYST:MEAS:CAT?", "reading the list of measurements");
    m_numbers.clear();
    const char* cursor = reply.data();
    const char* end = reply.data() + reply.size();
    while (cursor < end) {
        int number = 0;
        const auto result = std::from_chars(cursor, end, number);
        if (result.ec != std::errc() || number < 1 || (result.ptr != end && *result.ptr != ',')) {
            throw "reading the list of measurements from " + m_link->resource() + ": the reply \"" +
                reply.substr(0, 80) + "\" is not a list of measurement numbers";
        }
        m_numbers.push_back(number);
        cursor = result.ptr + (result.ptr == end ? 0 : 1);
    }
    m_listed = true;
}

int RemoteMeasurementCollection::count() {
    list();
    return static_cast<int>(m_numbers.size());
}

std::shared_ptr<automation::Object> RemoteMeasurementCollection::item(int index) {
    if (!m_listed) {
        list();
    }
    if (index < 1 || index > static_cast<int>(m_numbers.size())) {
        return nullptr;
    }
    return std::make_shared<RemoteMeasurement>(m_link,
                                               m_numbers[static_cast<std::size_t>(index - 1)]);
}

}  // namespace remote
