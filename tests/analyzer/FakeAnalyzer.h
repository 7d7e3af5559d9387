#pragma once

// A recording stand-in for the analyzer application: every automation call and SCPI
// string lands in one ordered log, SCPI replies are scripted per command.

#include <deque>
#include <map>
#include <memory>
#include <string>
#include <type_traits>
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
    // Records "what(a,b)": whole numbers as such, doubles without trailing zeros.
    template <typename... Args>
    void add(const std::string& what, const Args&... args) {
        std::string text;
        ((text += (text.empty() ? "" : ",") + argument(args)), ...);
        calls.push_back(what + "(" + text + ")");
    }
    // Records a getter's call and hands its value back.
    template <typename T>
    T logged(const std::string& call, T value) {
        add(call);
        return value;
    }

  private:
    static std::string number(double value);
    template <typename T>
    static std::string argument(T value) {
        if constexpr (std::is_same_v<T, bool>) {
            return value ? "true" : "false";
        } else if constexpr (std::is_floating_point_v<T>) {
            return number(value);
        } else {
            return std::to_string(value);
        }
    }
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
    void setFirstSetting(int value) override { m_log->add("measurement.setFirstSetting", value); }
    void setSecondSetting(int value) override { m_log->add("measurement.setSecondSetting", value); }
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
    std::shared_ptr<automation::Object> item(int index) override {
        return items.at(static_cast<std::size_t>(index - 1));
    }
};

class FakeSegmentTable : public automation::SegmentTable {
  public:
    explicit FakeSegmentTable(std::shared_ptr<CallLog> log) : m_log(std::move(log)) {}
    void writeTable(const std::vector<automation::SegmentRow>& written) override {
        rows = written;
        m_log->add("segments.writeTable", written.size());
    }
    void setPerSegmentBandwidth(int on) override {
        m_log->add("segments.setPerSegmentBandwidth", on);
    }
    void enablePerSegmentPower() override { m_log->add("segments.enablePerSegmentPower"); }

    std::vector<automation::SegmentRow> rows;

  private:
    std::shared_ptr<CallLog> m_log;
};

class FakeChannel : public automation::Channel {
  public:
    FakeChannel(std::shared_ptr<CallLog> log, std::shared_ptr<automation::Object> segmentTable)
        : m_log(std::move(log)), m_segmentTable(std::move(segmentTable)) {}
    void setSweepType(int code) override { m_log->add("channel.setSweepType", code); }
    double startFrequency() override { return m_log->logged("channel.startFrequency", start); }
    double stopFrequency() override { return m_log->logged("channel.stopFrequency", stop); }
    void setCwFrequency(double hz) override {
        m_log->add("channel.setCwFrequency", hz);
        start = stop = hz;
    }
    double startPower() override { return m_log->logged("channel.startPower", powerStart); }
    double stopPower() override { return m_log->logged("channel.stopPower", powerStop); }
    void setStartPower(double dbm) override {
        m_log->add("channel.setStartPower", dbm);
        powerStart = dbm;
    }
    void setStopPower(double dbm) override {
        m_log->add("channel.setStopPower", dbm);
        powerStop = dbm;
    }
    void setIfBandwidth(double hz) override { m_log->add("channel.setIfBandwidth", hz); }
    long numberOfPoints() override { return m_log->logged("channel.numberOfPoints", points); }
    void setNumberOfPoints(long value) override {
        m_log->add("channel.setNumberOfPoints", value);
        points = value;
    }
    void setAttenuatorMode(int port, int mode) override {
        m_log->add("channel.setAttenuatorMode", port, mode);
    }
    void setTriggerSetting(int value) override { m_log->add("channel.setTriggerSetting", value); }
    void singleSweep() override { m_log->add("channel.singleSweep"); }
    void setContinuousSweep(bool on) override { m_log->add("channel.setContinuousSweep", on); }
    void setIfBandwidthSwitch(bool on) override { m_log->add("channel.setIfBandwidthSwitch", on); }
    std::shared_ptr<automation::Object> segmentTable() override {
        return m_log->logged("channel.segmentTable", m_segmentTable);
    }

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
    std::shared_ptr<automation::Object> scpiParser() override {
        return m_log->logged("app.scpiParser", parser);
    }
    void reset() override { m_log->add("app.reset"); }
    void preset(int value) override { m_log->add("app.preset", value); }
    std::shared_ptr<automation::Object> activeChannel() override {
        return m_log->logged("app.activeChannel", channel);
    }
    std::shared_ptr<automation::Object> currentMeasurement() override {
        return m_log->logged("app.currentMeasurement", current);
    }
    std::shared_ptr<automation::Object> measurements() override {
        return m_log->logged("app.measurements", collection);
    }
    void setTriggerSetting(int value) override { m_log->add("app.setTriggerSetting", value); }
    void wait(int value, int timeLimitMs) override { m_log->add("app.wait", value, timeLimitMs); }

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
