// Channel, source and path control of the active channel, with the cached channel state
// that lets callers skip settings already in force.

#include <algorithm>

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/NumberText.h"
#include "platform/UpperCase.h"

using automation::queryInterface;
using platform::upperCased;

namespace {

// True when any two consecutive entries of values[first..last] differ.
bool varies(const std::vector<double>& values, int first, int last) {
    for (int i = first; i < last; ++i) {
        if (values[i] != values[i + 1]) {
            return true;
        }
    }
    return false;
}

}  // namespace

void CNetworkAnalyzer::setsweeptype(const std::string& type) {
    int code = 0;
    if (type == "linear") {
        code = 0;
    } else if (type == "cw") {
        code = 3;
    } else if (type == "powersweep") {
        code = 2;
    } else if (type == "segmentsweep") {
        code = 4;
    } else {
        throw "Unrecognized Sweep Type in CNetworkAnalyzer";
    }
    if (type == m_sweepType) {
        return;
    }
    auto active = channel();
    active->setSweepType(code);
    if (code != 4) {
        m_startFrequency = active->startFrequency();
        m_stopFrequency = active->stopFrequency();
    }
    if (code == 2) {
        m_sourcePower = active->startPower();
        m_stopPower = active->stopPower();
    }
    m_sweepType = type;
}

void CNetworkAnalyzer::setpowersweep(double startPower, double stopPower, double cwFrequency) {
    setsweeptype("powersweep");
    auto active = channel();
    active->setStartPower(startPower);
    active->setStopPower(stopPower);
    m_sourcePower = startPower;
    m_stopPower = stopPower;
    active->setCwFrequency(cwFrequency);
    m_startFrequency = cwFrequency;
    m_stopFrequency = cwFrequency;
}

void CNetworkAnalyzer::setcwfrequency(double frequency) {
    channel()->setCwFrequency(frequency);
    m_startFrequency = frequency;
    m_stopFrequency = frequency;
}

void CNetworkAnalyzer::setifbandwidth(double bandwidth) {
    channel()->setIfBandwidth(bandwidth);
}

void CNetworkAnalyzer::setchannelswitch(bool on) {
    channel()->setIfBandwidthSwitch(on);
}

long CNetworkAnalyzer::readnumberofpoints(bool query) {
    if (query) {
        m_numberOfPoints = channel()->numberOfPoints();
    }
    return m_numberOfPoints;
}

double CNetworkAnalyzer::readsourcepower(bool query) {
    if (query) {
        m_sourcePower =
            platform::leadingDouble(sendscpi("SOUR:POW? \"" + m_measurementPort + "\""));
    }
    return m_sourcePower;
}

void CNetworkAnalyzer::setsourcepower(double power, bool force) {
    if (m_sweepType == "powersweep") {
        setpowersweep(power, power, m_startFrequency);
        return;
    }
    if (power == m_sourcePower && !force) {
        return;
    }
    std::string command = "SOUR:POW ";
    platform::appendGeneral(command, power, 6);
    command += ",\"" + m_measurementPort + "\"";
    sendscpi(std::move(command));
    // Without this a later set back to the last read value would be skipped.
    m_sourcePower = power;
}

void CNetworkAnalyzer::setattenuator(const std::string& mode, int port) {
    const std::string upper = platform::upperCased(mode);
    if (port > m_portCount || port < 1) {
        m_ui.messageBox({"I do not recognize port " + std::to_string(port), "",
                         platform::Buttons::Ok, platform::BoxNone});
        return;
    }
    if (upper == "AUTO") {
        channel()->setAttenuatorMode(port, 0);
    } else if (upper == "MANUAL") {
        channel()->setAttenuatorMode(port, 1);
    } else {
        m_ui.messageBox(
            {"Unknown attenuator setting", "", platform::Buttons::Ok, platform::BoxNone});
    }
}

void CNetworkAnalyzer::setpathelement(const std::string& elements) {
    std::string::size_type begin = 0;
    for (auto slash = elements.find('/'); slash != std::string::npos;
         slash = elements.find('/', begin)) {
        const std::string item = elements.substr(begin, slash - begin);
        const auto comma = item.find(',');
        if (comma == std::string::npos) {
            throw std::string("CNetworkAnalyzer::setpathelement: the item \"" + item + "\" of \"" +
                              elements + "\" is not an element name, a comma and a value");
        }
        sendscpi("sense:path:conf:elem \"" + item.substr(0, comma) + "\",\"" +
                 item.substr(comma + 1) + "\"");
        begin = slash + 1;
    }
    const std::string last = elements.substr(begin);
    if (const auto dialog = last.find("Dialog"); dialog != std::string::npos) {
        m_pathDescription = last.substr(0, dialog);
    } else if (m_pathDescription.find(last) == std::string::npos) {
        m_pathDescription = last + " Not Measured";
    }
}

void CNetworkAnalyzer::setsegments(const std::vector<double>& starts,
                                   const std::vector<double>& stops,
                                   const std::vector<double>& points,
                                   const std::vector<double>& bandwidths,
                                   const std::vector<double>& powers, int first, int last) {
    if (last == 0) {
        last = static_cast<int>(starts.size()) - 1;
    }
    const std::size_t needed = last < 0 ? 0 : static_cast<std::size_t>(last) + 1;
    const std::size_t shortest =
        std::min({starts.size(), stops.size(), points.size(), bandwidths.size(), powers.size()});
    if (first < 0 || last < first || shortest < needed) {
        throw std::string("CNetworkAnalyzer::setsegments: segments " + std::to_string(first) +
                          " to " + std::to_string(last) +
                          " do not fit the segment lists (shortest list has " +
                          std::to_string(shortest) + " entries)");
    }
    setsweeptype("segmentsweep");

    std::vector<automation::SegmentRow> rows;
    rows.reserve(static_cast<std::size_t>(last - first + 1));
    m_numberOfPoints = 0;
    for (int i = first; i <= last; ++i) {
        rows.push_back({1, points[i], starts[i], stops[i], bandwidths[i], 0, powers[i]});
        m_numberOfPoints += static_cast<long>(points[i]);
    }
    auto table = segmenttable();
    // The first segment's own values, not those of list entry 0, which may lie outside the
    // range.
    if (varies(bandwidths, first, last)) {
        table->setPerSegmentBandwidth(1);
    } else {
        setifbandwidth(bandwidths[first]);
    }
    if (varies(powers, first, last)) {
        table->enablePerSegmentPower();
    } else {
        setsourcepower(powers[first], true);
    }
    table->writeTable(rows);
}

void CNetworkAnalyzer::definemeasurement(std::string receiver, std::string port,
                                         const std::string& /*third*/, std::string fourth,
                                         bool force) {
    receiver = platform::upperCased(std::move(receiver));
    port = platform::upperCased(std::move(port));
    fourth = platform::upperCased(std::move(fourth));
    if (receiver != m_measurementReceiver || port != m_measurementPort || force) {
        const std::string name = currentmeasurement()->name();
        sendscpi("CALC:PAR:DEL \"" + name + "\"");
        sendscpi("CALC:PAR:DEF:EXT \"" + name + "\",\"" + receiver + "," + port + "\"");
        sendscpi("DISP:WIND:TRACE:FEED \"" + name + "\"");
        m_measurementReceiver = receiver;
        m_measurementPort = port;
    }
    if (fourth == "NONE SET") {
        fourth = port;
    }
    setpathelement(fourth);
}

std::string CNetworkAnalyzer::readmeasurementname(bool query) {
    if (query) {
        const std::string parameter = currentmeasurement()->parameter();
        m_measurementReceiver = parameter.substr(0, parameter.find(','));
    }
    return m_measurementReceiver;
}

std::shared_ptr<automation::Measurement> CNetworkAnalyzer::currentmeasurement() {
    // Asked afresh: measurement definitions change the application's current measurement.
    m_pCurrentMeasurementObject = application()->currentMeasurement();
    auto measurement = queryInterface<automation::Measurement>(m_pCurrentMeasurementObject);
    if (!measurement) {
        throw std::string("CNetworkAnalyzer: the analyzer application has no current measurement");
    }
    return measurement;
}

void CNetworkAnalyzer::setupchannel() {
    application()->reset();
    m_sweepType = "linear";
    auto active = channel();
    m_startFrequency = active->startFrequency();
    m_stopFrequency = active->stopFrequency();
    definemeasurement("R1", "Port 1", "", "None Set", false);
    readsourcepower(true);
    readnumberofpoints(true);
    readmeasurementname(true);
    for (int port = 1; port <= m_portCount; ++port) {
        setattenuator("manual", port);
    }
}

void CNetworkAnalyzer::armtrigger() {
    application()->setTriggerSetting(3);
    channel()->setTriggerSetting(1);
}

void CNetworkAnalyzer::sweep(bool wait) {
    armtrigger();
    if (wait) {
        channel()->singleSweep();
        application()->wait(1, 5000);
    } else {
        channel()->setContinuousSweep(true);
    }
}

void CNetworkAnalyzer::primemeasurement() {
    if (m_measurementPrimed) {
        return;
    }
    auto measurement = currentmeasurement();
    measurement->setFirstSetting(1);
    measurement->setSecondSetting(-1);
    m_measurementPrimed = true;
}
