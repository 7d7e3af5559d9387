#include "sim/AutomationObjects.h"

#include <sstream>

namespace sim {
namespace {

std::string number(double value) {
    std::ostringstream text;
    text << value;
    return text.str();
}

class Handle {
  public:
    Handle(std::shared_ptr<Instrument> instrument, unsigned generation)
        : m_instrument(std::move(instrument)), m_generation(generation) {}

    template <class F>
    auto call(const std::string& what, F&& f) {
        return m_instrument->call(m_generation, what, std::forward<F>(f));
    }

    std::shared_ptr<Instrument> m_instrument;
    unsigned m_generation;
};

class SimScpiParser final : public automation::ScpiParser, private Handle {
  public:
    using Handle::Handle;
    std::string parse(const std::string& command) override {
        return m_instrument->parse(m_generation, command);
    }
};

class SimSegmentTable final : public automation::SegmentTable, private Handle {
  public:
    using Handle::Handle;

    void writeTable(const std::vector<automation::SegmentRow>& rows) override {
        call("SegmentTable.writeTable(" + std::to_string(rows.size()) + " rows)",
             [&] { m_instrument->writeSegments(rows); });
    }
    void setPerSegmentBandwidth(int on) override {
        call("SegmentTable.setPerSegmentBandwidth(" + std::to_string(on) + ")",
             [&] { m_instrument->setPerSegmentBandwidth(on != 0); });
    }
    void enablePerSegmentPower() override {
        call("SegmentTable.enablePerSegmentPower()",
             [&] { m_instrument->setPerSegmentPower(true); });
    }
};

class SimChannel final : public automation::Channel, private Handle {
  public:
    using Handle::Handle;

    void setSweepType(int code) override {
        call("Channel.setSweepType(" + std::to_string(code) + ")", [&] {
            if (code != 0 && code != 2 && code != 3 && code != 4) {
                throw scpi::Error{-224, "no sweep type " + std::to_string(code)};
            }
            m_instrument->setSweepType(static_cast<SweepType>(code));
        });
    }
    double startFrequency() override {
        return call("Channel.startFrequency()", [&] { return m_instrument->startFrequency(); });
    }
    double stopFrequency() override {
        return call("Channel.stopFrequency()", [&] { return m_instrument->stopFrequency(); });
    }
    void setCwFrequency(double hz) override {
        call("Channel.setCwFrequency(" + number(hz) + ")",
             [&] { m_instrument->setCwFrequency(hz); });
    }
    double startPower() override {
        return call("Channel.startPower()", [&] { return m_instrument->channel().startPowerDbm; });
    }
    double stopPower() override {
        return call("Channel.stopPower()", [&] { return m_instrument->channel().stopPowerDbm; });
    }
    void setStartPower(double dbm) override {
        call("Channel.setStartPower(" + number(dbm) + ")",
             [&] { m_instrument->setStartPower(dbm); });
    }
    void setStopPower(double dbm) override {
        call("Channel.setStopPower(" + number(dbm) + ")", [&] { m_instrument->setStopPower(dbm); });
    }
    void setIfBandwidth(double hz) override {
        call("Channel.setIfBandwidth(" + number(hz) + ")",
             [&] { m_instrument->setIfBandwidth(hz); });
    }
    long numberOfPoints() override {
        return call("Channel.numberOfPoints()", [&] { return m_instrument->sweepPoints(); });
    }
    void setNumberOfPoints(long points) override {
        call("Channel.setNumberOfPoints(" + std::to_string(points) + ")",
             [&] { m_instrument->setPoints(points); });
    }
    void setAttenuatorMode(int port, int mode) override {
        call("Channel.setAttenuatorMode(" + std::to_string(port) + "," + std::to_string(mode) + ")",
             [&] {
                 if (mode != 0 && mode != 1) {
                     throw scpi::Error{-224, "no attenuator mode " + std::to_string(mode)};
                 }
                 m_instrument->setAttenuatorAuto(port, mode == 0);
             });
    }
    void setTriggerSetting(int value) override {
        call("Channel.setTriggerSetting(" + std::to_string(value) + ")", [&] {
            if (value < 0 || value > 3) {
                throw scpi::Error{-224, "no channel trigger setting " + std::to_string(value)};
            }
            m_instrument->setChannelTrigger(static_cast<ChannelTrigger>(value));
        });
    }
    void singleSweep() override {
        call("Channel.singleSweep()", [&] { m_instrument->setSweepMode(SweepMode::Single); });
    }
    void setContinuousSweep(bool on) override {
        call(std::string("Channel.setContinuousSweep(") + (on ? "true" : "false") + ")",
             [&] { m_instrument->setSweepMode(on ? SweepMode::Continuous : SweepMode::Hold); });
    }
    void setIfBandwidthSwitch(bool on) override {
        call(std::string("Channel.setIfBandwidthSwitch(") + (on ? "true" : "false") + ")",
             [&] { m_instrument->setIfBandwidthTracking(on); });
    }
    std::shared_ptr<automation::Object> segmentTable() override {
        call("Channel.segmentTable()", [] {});
        return std::make_shared<SimSegmentTable>(m_instrument, m_generation);
    }
};

class SimMeasurement final : public automation::Measurement,
                             public automation::MeasurementData,
                             private Handle {
  public:
    SimMeasurement(std::shared_ptr<Instrument> instrument, unsigned generation, int id)
        : Handle(std::move(instrument), generation), m_id(id) {}

    std::string name() override {
        return call("Measurement.name()",
                    [&] { return m_instrument->measurementNumbered(m_id).name; });
    }
    std::string parameter() override {
        return call("Measurement.parameter()",
                    [&] { return m_instrument->measurementNumbered(m_id).parameter; });
    }
    void setFirstSetting(int value) override {
        call("Measurement.setFirstSetting(" + std::to_string(value) + ")",
             [&] { m_instrument->measurementNumbered(m_id).firstSetting = value; });
    }
    void setSecondSetting(int value) override {
        call("Measurement.setSecondSetting(" + std::to_string(value) + ")",
             [&] { m_instrument->measurementNumbered(m_id).secondSetting = value; });
    }
    long readData(int location, int formatCode, long& points,
                  std::span<float> destination) override {
        return call("MeasurementData.readData(" + std::to_string(location) + "," +
                        std::to_string(formatCode) + "," + std::to_string(points) + ")",
                    [&] {
                        return m_instrument->readTrace(m_id, location, formatCode, points,
                                                       destination);
                    });
    }

  private:
    int m_id;
};

class SimMeasurementCollection final : public automation::MeasurementCollection, private Handle {
  public:
    using Handle::Handle;
    int count() override {
        return call("Measurements.count()",
                    [&] { return static_cast<int>(m_instrument->measurementNumbers().size()); });
    }
    std::shared_ptr<automation::Object> item(int index) override {
        int id = call("Measurements.item(" + std::to_string(index) + ")", [&] {
            const auto numbers = m_instrument->measurementNumbers();
            return index >= 1 && index <= static_cast<int>(numbers.size())
                       ? numbers[static_cast<std::size_t>(index - 1)]
                       : 0;
        });
        if (id == 0) {
            return nullptr;
        }
        return std::make_shared<SimMeasurement>(m_instrument, m_generation, id);
    }
};

class SimApplication final : public automation::Application, private Handle {
  public:
    using Handle::Handle;

    std::shared_ptr<automation::Object> scpiParser() override {
        call("Application.scpiParser()", [] {});
        return std::make_shared<SimScpiParser>(m_instrument, m_generation);
    }
    void reset() override {
        call("Application.reset()", [&] { m_instrument->preset(); });
    }
    void preset(int value) override {
        call("Application.preset(" + std::to_string(value) + ")", [&] { m_instrument->preset(); });
    }
    std::shared_ptr<automation::Object> activeChannel() override {
        call("Application.activeChannel()", [] {});
        return std::make_shared<SimChannel>(m_instrument, m_generation);
    }
    std::shared_ptr<automation::Object> currentMeasurement() override {
        int id = call("Application.currentMeasurement()",
                      [&] { return m_instrument->selectedMeasurementNumber(); });
        if (id == 0) {
            return nullptr;
        }
        return std::make_shared<SimMeasurement>(m_instrument, m_generation, id);
    }
    std::shared_ptr<automation::Object> measurements() override {
        call("Application.measurements()", [] {});
        return std::make_shared<SimMeasurementCollection>(m_instrument, m_generation);
    }
    void setTriggerSetting(int value) override {
        call("Application.setTriggerSetting(" + std::to_string(value) + ")", [&] {
            if (value < 1 || value > 3) {
                throw scpi::Error{-224, "no trigger setting " + std::to_string(value)};
            }
            m_instrument->setTriggerSource(static_cast<TriggerSource>(value));
        });
    }
    void wait(int value, int timeLimitMs) override {
        call("Application.wait(" + std::to_string(value) + "," + std::to_string(timeLimitMs) + ")",
             [&] { m_instrument->waitForSweep(std::chrono::milliseconds(timeLimitMs)); });
    }
};

}  // namespace

std::shared_ptr<automation::Object> makeApplicationObject(std::shared_ptr<Instrument> instrument) {
    unsigned generation = instrument->generation();
    return std::make_shared<SimApplication>(std::move(instrument), generation);
}

}  // namespace sim
