#pragma once

// A recording stand-in for the analyzer application: every automation call and SCPI
// string lands in one ordered log, SCPI replies are scripted per command.

#include <deque>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"

namespace fakeanalyzer {

struct CallLog {
    std::vector<std::string> calls;
    // The SCPI strings only, in order.
    std::vector<std::string> scpi() const;
    // Calls whose text starts with prefix, in order.
    std::vector<std::string> matching(const std::string& prefix) const;
    void clear() { calls.clear(); }
};

class FakeParser : public automation::ScpiParser {
  public:
    explicit FakeParser(std::shared_ptr<CallLog> log) : m_log(std::move(log)) {}
    // Replies for one command, used in order; the last one repeats.
    void reply(const std::string& command, std::vector<std::string> replies);
    std::string parse(const std::string& command) override;
    // A command that fails as a broken link would, by raising this text.
    std::string failingCommand;

  private:
    std::shared_ptr<CallLog> m_log;
    std::map<std::string, std::deque<std::string>> m_replies;
};

class FakeMeasurement : public automation::Measurement, public automation::MeasurementData {
  public:
    FakeMeasurement(std::shared_ptr<CallLog> log, std::string name, std::string parameter)
        : m_log(std::move(log)), m_name(std::move(name)), m_parameter(std::move(parameter)) {}
    std::string name() override { return m_name; }
    std::string parameter() override { return m_parameter; }
    void setFirstSetting(int value) override;
    void setSecondSetting(int value) override;
    // Fills value i with formatCode * 1000 + i.
    long readData(int location, int formatCode, long& points,
                  std::span<float> destination) override;

    long status = 0;
    // When set, the number of points the read reports back.
    long deliveredPoints = -1;

  private:
    std::shared_ptr<CallLog> m_log;
    std::string m_name;
    std::string m_parameter;
};

class FakeCollection : public automation::MeasurementCollection {
  public:
    std::vector<std::shared_ptr<automation::Object>> items;
    int count() override { return static_cast<int>(items.size()); }
    std::shared_ptr<automation::Object> item(int index) override;
};

class FakeSegmentTable : public automation::SegmentTable {
  public:
    explicit FakeSegmentTable(std::shared_ptr<CallLog> log) : m_log(std::move(log)) {}
    void writeTable(const std::vector<automation::SegmentRow>& rows) override;
    void setPerSegmentBandwidth(int on) override;
    void enablePerSegmentPower() override;

    std::vector<automation::SegmentRow> rows;

  private:
    std::shared_ptr<CallLog> m_log;
};

class FakeChannel : public automation::Channel {
  public:
    FakeChannel(std::shared_ptr<CallLog> log, std::shared_ptr<automation::Object> segmentTable)
        : m_log(std::move(log)), m_segmentTable(std::move(segmentTable)) {}
    void setSweepType(int code) override;
    double startFrequency() override;
    double stopFrequency() override;
    void setCwFrequency(double hz) override;
    double startPower() override;
    double stopPower() override;
    void setStartPower(double dbm) override;
    void setStopPower(double dbm) override;
    void setIfBandwidth(double hz) override;
    long numberOfPoints() override;
    void setNumberOfPoints(long points) override;
    void setAttenuatorMode(int port, int mode) override;
    void setTriggerSetting(int value) override;
    void singleSweep() override;
    void setContinuousSweep(bool on) override;
    void setIfBandwidthSwitch(bool on) override;
    std::shared_ptr<automation::Object> segmentTable() override;

    double start = 10e6;
    double stop = 20e9;
    double powerStart = -20;
    double powerStop = 0;
    long points = 201;

  private:
    std::shared_ptr<CallLog> m_log;
    std::shared_ptr<automation::Object> m_segmentTable;
};

class FakeApplication : public automation::Application {
  public:
    explicit FakeApplication(std::shared_ptr<CallLog> log) : m_log(std::move(log)) {}
    std::shared_ptr<automation::Object> scpiParser() override;
    void reset() override;
    void preset(int value) override;
    std::shared_ptr<automation::Object> activeChannel() override;
    std::shared_ptr<automation::Object> currentMeasurement() override;
    std::shared_ptr<automation::Object> measurements() override;
    void setTriggerSetting(int value) override;
    void wait(int value, int timeLimitMs) override;

    std::shared_ptr<automation::Object> parser;
    std::shared_ptr<automation::Object> channel;
    std::shared_ptr<automation::Object> current;
    std::shared_ptr<automation::Object> collection;

  private:
    std::shared_ptr<CallLog> m_log;
};

// A complete, well-behaved analyzer: four ports, model T3872A with options 010 and 080,
// current measurement "CH1_S11_1" measuring R1,PORT 1 at -30 dBm.
struct FakeAnalyzer {
    FakeAnalyzer();
    std::shared_ptr<CallLog> log;
    std::shared_ptr<FakeParser> parser;
    std::shared_ptr<FakeSegmentTable> segmentTable;
    std::shared_ptr<FakeChannel> channel;
    std::shared_ptr<FakeMeasurement> current;
    std::shared_ptr<FakeCollection> collection;
    std::shared_ptr<FakeApplication> application;
};

// Registers a back end under a name for the lifetime of the object.
class BackendRegistration {
  public:
    BackendRegistration(const std::string& name, std::shared_ptr<automation::Object> created);
    ~BackendRegistration();
    BackendRegistration(const BackendRegistration&) = delete;
    BackendRegistration& operator=(const BackendRegistration&) = delete;

  private:
    std::string m_name;
};

}  // namespace fakeanalyzer
