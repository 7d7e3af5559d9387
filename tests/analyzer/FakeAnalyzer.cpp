#include "FakeAnalyzer.h"

#include "analyzer/automation/BackendFactory.h"

namespace fakeanalyzer {

std::string CallLog::number(double value) {
    std::string text = std::to_string(value);
    text.erase(text.find_last_not_of('0') + 1);
    if (text.back() == '.') {
        text.pop_back();
    }
    return text;
}

std::vector<std::string> CallLog::scpi() const {
    auto result = matching("scpi ");
    for (auto& command : result) {
        command.erase(0, 5);
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

long FakeMeasurement::readData(int location, int formatCode, long& points,
                               std::span<float> destination) {
    m_log->add("measurement " + m_name + ".readData", location, formatCode, points);
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
