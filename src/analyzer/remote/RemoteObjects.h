#pragma once

// The automation objects of the LAN back end. Objects hold the shared link; measurements
// hold the instrument's measurement number, as the in-process objects do.

#include <memory>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"
#include "analyzer/remote/ScpiLink.h"

namespace remote {

// Shortest text that reads back as the same double.
std::string numberText(double value);

class RemoteParser final : public automation::ScpiParser {
  public:
    explicit RemoteParser(std::shared_ptr<ScpiLink> link) : m_link(std::move(link)) {}
    std::string parse(const std::string& command) override;

  private:
    std::shared_ptr<ScpiLink> m_link;
};

class RemoteSegmentTable final : public automation::SegmentTable {
  public:
    explicit RemoteSegmentTable(std::shared_ptr<ScpiLink> link) : m_link(std::move(link)) {}
    void writeTable(const std::vector<automation::SegmentRow>& rows) override;
    void setPerSegmentBandwidth(int on) override;
    void enablePerSegmentPower() override;

  private:
    std::shared_ptr<ScpiLink> m_link;
    std::string m_message;
};

class RemoteChannel final : public automation::Channel {
  public:
    explicit RemoteChannel(std::shared_ptr<ScpiLink> link) : m_link(std::move(link)) {}
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

  private:
    std::shared_ptr<ScpiLink> m_link;
};

class RemoteMeasurement final : public automation::Measurement, public automation::MeasurementData {
  public:
    RemoteMeasurement(std::shared_ptr<ScpiLink> link, int number)
        : m_link(std::move(link)), m_number(number) {}
    std::string name() override;
    std::string parameter() override;
    void setFirstSetting(int value) override;
    void setSecondSetting(int value) override;
    long readData(int location, int formatCode, long& points,
                  std::span<float> destination) override;

  private:
    // "measurement 'measratio'" once the name is known, else "measurement 3".
    std::string label() const;

    std::shared_ptr<ScpiLink> m_link;
    int m_number;
    std::string m_name;
};

// A snapshot of the analyzer's measurement numbers, taken by count() (or the first item()).
class RemoteMeasurementCollection final : public automation::MeasurementCollection {
  public:
    explicit RemoteMeasurementCollection(std::shared_ptr<ScpiLink> link)
        : m_link(std::move(link)) {}
    int count() override;
    std::shared_ptr<automation::Object> item(int index) override;

  private:
    void list();

    std::shared_ptr<ScpiLink> m_link;
    std::vector<int> m_numbers;
    bool m_listed = false;
};

class RemoteApplication final : public automation::Application {
  public:
    explicit RemoteApplication(std::shared_ptr<ScpiLink> link) : m_link(std::move(link)) {}
    std::shared_ptr<automation::Object> scpiParser() override;
    void reset() override;
    void preset(int value) override;
    std::shared_ptr<automation::Object> activeChannel() override;
    std::shared_ptr<automation::Object> currentMeasurement() override;
    std::shared_ptr<automation::Object> measurements() override;
    void setTriggerSetting(int value) override;
    void wait(int value, int timeLimitMs) override;

  private:
    std::shared_ptr<ScpiLink> m_link;
};

}  // namespace remote
