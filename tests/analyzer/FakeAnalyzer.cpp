#include "FakeAnalyzer.h"

#include "analyzer/automation/BackendFactory.h"

namespace fakeanalyzer {

namespace {

std::string number(double value) {
    std::string text = std::to_string(value);
    text.erase(text.find_last_not_of('0') + 1);
    if (text.back() == '.') {
        text.pop_back();
    }
    return text;
}

}  // namespace

std::vector<std::string> CallLog::scpi() const {
    std::vector<std::string> result;
    for (const auto& call : calls) {
        if (call.starts_with("scpi ")) {
            result.push_back(call.substr(5));
        }
    }
    return result;
}

std::vector<std::string> CallLog::matching(const std::string& prefix) const {
    std::vector<std::string> result;
    for (const auto& call : calls) {
        if (call.starts_with(prefix)) {
            result.push_back(call);
        }
    }
    return result;
}

void FakeParser::reply(const std::string& command, std::vector<std::string> replies) {
    m_replies[command] = std::deque<std::string>(replies.begin(), replies.end());
}

std::string FakeParser::parse(const std::string& command) {
    m_log->calls.push_back("scpi " + command);
    if (command == failingCommand) {
        throw std::string("link to the analyzer lost");
    }
    auto it = m_replies.find(command);
    if (it == m_replies.end() || it->second.empty()) {
        return "";
    }
    std::string answer = it->second.front();
    if (it->second.size() > 1) {
        it->second.pop_front();
    }
    return answer;
}

void FakeMeasurement::setFirstSetting(int value) {
    m_log->calls.push_back("measurement.setFirstSetting(" + std::to_string(value) + ")");
}

void FakeMeasurement::setSecondSetting(int value) {
    m_log->calls.push_back("measurement.setSecondSetting(" + std::to_string(value) + ")");
}

long FakeMeasurement::readData(int location, int formatCode, long& points,
                               std::span<float> destination) {
    m_log->calls.push_back("measurement " + m_name + ".readData(" + std::to_string(location) + "," +
                           std::to_string(formatCode) + "," + std::to_string(points) + ")");
    if (status != 0) {
        return status;
    }
    if (deliveredPoints >= 0) {
        points = deliveredPoints;
    }
    for (long i = 0; i < points && static_cast<std::size_t>(i) < destination.size(); ++i) {
        destination[static_cast<std::size_t>(i)] = static_cast<float>(formatCode * 1000 + i);
    }
    return 0;
}

std::shared_ptr<automation::Object> FakeCollection::item(int index) {
    if (index < 1 || index > count()) {
        return nullptr;
    }
    return items[static_cast<std::size_t>(index - 1)];
}

void FakeSegmentTable::writeTable(const std::vector<automation::SegmentRow>& written) {
    rows = written;
    m_log->calls.push_back("segments.writeTable(" + std::to_string(written.size()) + ")");
}

void FakeSegmentTable::setPerSegmentBandwidth(int on) {
    m_log->calls.push_back("segments.setPerSegmentBandwidth(" + std::to_string(on) + ")");
}

void FakeSegmentTable::enablePerSegmentPower() {
    m_log->calls.push_back("segments.enablePerSegmentPower()");
}

void FakeChannel::setSweepType(int code) {
    m_log->calls.push_back("channel.setSweepType(" + std::to_string(code) + ")");
}
double FakeChannel::startFrequency() {
    m_log->calls.push_back("channel.startFrequency()");
    return start;
}
double FakeChannel::stopFrequency() {
    m_log->calls.push_back("channel.stopFrequency()");
    return stop;
}
void FakeChannel::setCwFrequency(double hz) {
    m_log->calls.push_back("channel.setCwFrequency(" + number(hz) + ")");
    start = stop = hz;
}
double FakeChannel::startPower() {
    m_log->calls.push_back("channel.startPower()");
    return powerStart;
}
double FakeChannel::stopPower() {
    m_log->calls.push_back("channel.stopPower()");
    return powerStop;
}
void FakeChannel::setStartPower(double dbm) {
    m_log->calls.push_back("channel.setStartPower(" + number(dbm) + ")");
    powerStart = dbm;
}
void FakeChannel::setStopPower(double dbm) {
    m_log->calls.push_back("channel.setStopPower(" + number(dbm) + ")");
    powerStop = dbm;
}
void FakeChannel::setIfBandwidth(double hz) {
    m_log->calls.push_back("channel.setIfBandwidth(" + number(hz) + ")");
}
long FakeChannel::numberOfPoints() {
    m_log->calls.push_back("channel.numberOfPoints()");
    return points;
}
void FakeChannel::setNumberOfPoints(long value) {
    m_log->calls.push_back("channel.setNumberOfPoints(" + std::to_string(value) + ")");
    points = value;
}
void FakeChannel::setAttenuatorMode(int port, int mode) {
    m_log->calls.push_back("channel.setAttenuatorMode(" + std::to_string(port) + "," +
                           std::to_string(mode) + ")");
}
void FakeChannel::setTriggerSetting(int value) {
    m_log->calls.push_back("channel.setTriggerSetting(" + std::to_string(value) + ")");
}
void FakeChannel::singleSweep() {
    m_log->calls.push_back("channel.singleSweep()");
}
void FakeChannel::setContinuousSweep(bool on) {
    m_log->calls.push_back(std::string("channel.setContinuousSweep(") + (on ? "true" : "false") +
                           ")");
}
void FakeChannel::setIfBandwidthSwitch(bool on) {
    m_log->calls.push_back(std::string("channel.setIfBandwidthSwitch(") + (on ? "true" : "false") +
                           ")");
}
std::shared_ptr<automation::Object> FakeChannel::segmentTable() {
    m_log->calls.push_back("channel.segmentTable()");
    return m_segmentTable;
}

std::shared_ptr<automation::Object> FakeApplication::scpiParser() {
    m_log->calls.push_back("app.scpiParser()");
    return parser;
}
void FakeApplication::reset() {
    m_log->calls.push_back("app.reset()");
}
void FakeApplication::preset(int value) {
    m_log->calls.push_back("app.preset(" + std::to_string(value) + ")");
}
std::shared_ptr<automation::Object> FakeApplication::activeChannel() {
    m_log->calls.push_back("app.activeChannel()");
    return channel;
}
std::shared_ptr<automation::Object> FakeApplication::currentMeasurement() {
    m_log->calls.push_back("app.currentMeasurement()");
    return current;
}
std::shared_ptr<automation::Object> FakeApplication::measurements() {
    m_log->calls.push_back("app.measurements()");
    return collection;
}
void FakeApplication::setTriggerSetting(int value) {
    m_log->calls.push_back("app.setTriggerSetting(" + std::to_string(value) + ")");
}
void FakeApplication::wait(int value, int timeLimitMs) {
    m_log->calls.push_back("app.wait(" + std::to_string(value) + "," + std::to_string(timeLimitMs) +
                           ")");
}

FakeAnalyzer::FakeAnalyzer()
    : log(std::make_shared<CallLog>()),
      parser(std::make_shared<FakeParser>(log)),
      segmentTable(std::make_shared<FakeSegmentTable>(log)),
      channel(std::make_shared<FakeChannel>(log, segmentTable)),
      current(std::make_shared<FakeMeasurement>(log, "CH1_S11_1", "R1,PORT 1")),
      collection(std::make_shared<FakeCollection>()),
      application(std::make_shared<FakeApplication>(log)) {
    application->parser = parser;
    application->channel = channel;
    application->current = current;
    application->collection = collection;
    parser->reply("*IDN?", {"Maker,T3872A,US1234,A.13.55"});
    parser->reply("*opt?", {"\"010,080\""});
    parser->reply("diag:portcount?", {"4"});
    parser->reply("SOUR:POW? \"PORT 1\"", {"-30"});
    parser->reply("SYST:ERR?", {"+0,\"No error\""});
}

BackendRegistration::BackendRegistration(const std::string& name,
                                         std::shared_ptr<automation::Object> created)
    : m_name(name) {
    automation::BackendFactory::registerBackend(name,
                                                [created](const std::string&) { return created; });
}

BackendRegistration::~BackendRegistration() {
    automation::BackendFactory::unregisterBackend(m_name);
}

}  // namespace fakeanalyzer
