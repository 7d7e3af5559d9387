#include "analyzer/remote/RemoteApplication.h"

#include <algorithm>

#include "analyzer/remote/MessageQueries.h"
#include "analyzer/remote/RemoteObjects.h"

namespace remote {

std::shared_ptr<automation::Object> makeApplication(std::shared_ptr<ScpiLink> link) {
    return std::make_shared<RemoteApplication>(std::move(link));
}

std::shared_ptr<automation::Object> RemoteApplication::scpiParser() {
    return std::make_shared<RemoteParser>(m_link);
}

void RemoteApplication::reset() {
    m_link->command("SYST:PRES", "presetting the analyzer");
}

void RemoteApplication::preset(int) {
    m_link->command("SYST:FPR", "presetting the analyzer");
}

std::shared_ptr<automation::Object> RemoteApplication::activeChannel() {
    // The instrument has one channel; asking which would be a round trip for nothing.
    return std::make_shared<RemoteChannel>(m_link);
}

std::shared_ptr<automation::Object> RemoteApplication::currentMeasurement() {
    const double number =
        m_link->queryNumber("CALC:PAR:MNUM?", "reading the number of the current measurement");
    if (number < 1) {
        return nullptr;
    }
    return std::make_shared<RemoteMeasurement>(m_link, static_cast<int>(number));
}

std::shared_ptr<automation::Object> RemoteApplication::measurements() {
    return std::make_shared<RemoteMeasurementCollection>(m_link);
}

void RemoteApplication::setTriggerSetting(int value) {
    static constexpr const char* sources[] = {"EXT", "IMM", "MAN"};
    if (value < 1 || value > 3) {
        throw "Application.setTriggerSetting(" + std::to_string(value) + ") on " +
            m_link->resource() + ": no trigger setting " + std::to_string(value);
    }
    m_link->command(std::string("TRIG:SOUR ") + sources[value - 1], "setting the trigger source");
}

void RemoteApplication::wait(int, int timeLimitMs) {
    m_link->queryWithin("*OPC?", std::chrono::milliseconds(std::max(timeLimitMs, 0)),
                        "waiting for the sweep");
}

std::string RemoteParser::parse(const std::string& command) {
    constexpr std::size_t quotedLength = 60;
    const std::string quoted =
        "\"" + (command.size() > quotedLength ? command.substr(0, quotedLength) + "..." : command) +
        "\"";
    if (holdsQuery(command)) {
        return m_link->query(command, "reading the reply to " + quoted);
    }
    m_link->command(command, "sending " + quoted);
    return {};
}

}  // namespace remote
