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
        call("SegmentTable.writeTable(" + std::to_string(rows.size()) + " rows)", [&] {
            long total = 0;
            for (std::size_t i = 0; i < rows.size(); ++i) {
                const auto& row = rows[i];
                std::string where = "segment table row " + std::to_string(i + 1) + ": ";
                if (row.points < 1 || row.points != static_cast<long>(row.points)) {
                    throw std::string(where + "points must be a whole number of at least 1, not " +
                                      number(row.points));
                }
                if (row.start < 0 || row.stop < row.start) {
                    throw std::string(where + "start " + number(row.start) + " Hz and stop " +
                                      number(row.stop) + " Hz do not form a range");
                }
                if (row.ifBandwidth <= 0) {
                    throw std::string(where + "IF bandwidth must be positive, not " +
                                      number(row.ifBandwidth));
                }
                if (row.on != 0) {
                    total += static_cast<long>(row.points);
                }
            }
            if (total > 100001) {
                throw std::string("segment table: " + std::to_string(total) +
                                  " points exceed the 100001 the analyzer sweeps");
            }
            m_instrument->channel().segments = rows;
        });
    }
    void setPerSegmentBandwidth(int on) override {
        call("SegmentTable.setPerSegmentBandwidth(" + std::to_string(on) + ")",
             [&] { m_instrument->channel().perSegmentBandwidth = on != 0; });
    }
    void enablePerSegmentPower() override {
        call("SegmentTable.enablePerSegmentPower()",
             [&] { m_instrument->channel().perSegmentPower = true; });
    }
};

class SimChannel final : public automation::Channel, private Handle {
  public:
    using Handle::Handle;

    void setSweepType(int code) override {
        call("Channel.setSweepType(" + std::to_string(code) + ")", [&] {
            if (code != 0 && code != 2 && code != 3 && code != 4) {
                throw std::string("Channel.setSweepType: no sweep type " + std::to_string(code));
            }
            m_instrument->channel().sweepType = code;
        });
    }
    double startFrequency() override {
        return call("Channel.startFrequency()", [&] {
            const ChannelState& c = m_instrument->channel();
            if (c.sweepType == 2 || c.sweepType == 3) {
                return c.cwHz;
            }
            if (c.sweepType == 4 && !c.segments.empty()) {
                return c.segments.front().start;
            }
            return c.startHz;
        });
    }
    double stopFrequency() override {
        return call("Channel.stopFrequency()", [&] {
            const ChannelState& c = m_instrument->channel();
            if (c.sweepType == 2 || c.sweepType == 3) {
                return c.cwHz;
            }
            if (c.sweepType == 4 && !c.segments.empty()) {
                return c.segments.back().stop;
            }
            return c.stopHz;
        });
    }
    void setCwFrequency(double hz) override {
        call("Channel.setCwFrequency(" + number(hz) + ")", [&] {
            if (hz < 0) {
                throw std::string("Channel.setCwFrequency: negative frequency " + number(hz));
            }
            m_instrument->channel().cwHz = hz;
        });
    }
    double startPower() override {
        return call("Channel.startPower()", [&] { return m_instrument->channel().startPowerDbm; });
    }
    double stopPower() override {
        return call("Channel.stopPower()", [&] { return m_instrument->channel().stopPowerDbm; });
    }
    void setStartPower(double dbm) override {
        call("Channel.setStartPower(" + number(dbm) + ")",
             [&] { m_instrument->channel().startPowerDbm = dbm; });
    }
    void setStopPower(double dbm) override {
        call("Channel.setStopPower(" + number(dbm) + ")",
             [&] { m_instrument->channel().stopPowerDbm = dbm; });
    }
    void setIfBandwidth(double hz) override {
        call("Channel.setIfBandwidth(" + number(hz) + ")", [&] {
            if (hz <= 0) {
                throw std::string("Channel.setIfBandwidth: bandwidth must be positive, not " +
                                  number(hz));
            }
            m_instrument->channel().ifBandwidthHz = hz;
        });
    }
    long numberOfPoints() override {
        return call("Channel.numberOfPoints()", [&] { return m_instrument->sweepPoints(); });
    }
    void setNumberOfPoints(long points) override {
        call("Channel.setNumberOfPoints(" + std::to_string(points) + ")", [&] {
            if (points < 1 || points > 100001) {
                throw std::string("Channel.setNumberOfPoints: " + std::to_string(points) +
                                  " is outside 1 to 100001");
            }
            m_instrument->channel().points = points;
        });
    }
    void setAttenuatorMode(int port, int mode) override {
        call(
            "Channel.setAttenuatorMode(" + std::to_string(port) + "," + std::to_string(mode) + ")",
            [&] {
                if (port < 1 || port > m_instrument->scenario().portCount) {
                    throw std::string("Channel.setAttenuatorMode: no port " + std::to_string(port));
                }
                if (mode != 0 && mode != 1) {
                    throw std::string("Channel.setAttenuatorMode: no mode " + std::to_string(mode));
                }
                m_instrument->channel().attenuatorMode[port] = mode;
            });
    }
    void setTriggerSetting(int value) override {
        call("Channel.setTriggerSetting(" + std::to_string(value) + ")",
             [&] { m_instrument->channel().triggerSetting = value; });
    }
    void singleSweep() override {
        call("Channel.singleSweep()", [&] { m_instrument->sweep(); });
    }
    void setContinuousSweep(bool on) override {
        // Each switch-on takes one sweep, so readings always follow the last settings.
        call(std::string("Channel.setContinuousSweep(") + (on ? "true" : "false") + ")", [&] {
            if (on) {
                m_instrument->sweep();
            }
        });
    }
    void setIfBandwidthSwitch(bool on) override {
        call(std::string("Channel.setIfBandwidthSwitch(") + (on ? "true" : "false") + ")",
             [&] { m_instrument->channel().ifBandwidthSwitch = on; });
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
        return call("Measurement.name()", [&] { return state().name; });
    }
    std::string parameter() override {
        return call("Measurement.parameter()", [&] { return state().parameter; });
    }
    void setFirstSetting(int value) override {
        call("Measurement.setFirstSetting(" + std::to_string(value) + ")",
             [&] { state().firstSetting = value; });
    }
    void setSecondSetting(int value) override {
        call("Measurement.setSecondSetting(" + std::to_string(value) + ")",
             [&] { state().secondSetting = value; });
    }
    long readData(int location, int formatCode, long& points,
                  std::span<float> destination) override {
        return call("MeasurementData.readData(" + std::to_string(location) + "," +
                        std::to_string(formatCode) + "," + std::to_string(points) + ")",
                    [&] {
                        state();
                        return m_instrument->readTrace(m_id, location, formatCode, points,
                                                       destination);
                    });
    }

  private:
    MeasurementState& state() {
        MeasurementState* m = m_instrument->measurementById(m_id);
        if (!m) {
            throw std::string("simulated analyzer: the measurement object was deleted");
        }
        return *m;
    }
    int m_id;
};

class SimMeasurementCollection final : public automation::MeasurementCollection, private Handle {
  public:
    using Handle::Handle;
    int count() override {
        return call("Measurements.count()",
                    [&] { return static_cast<int>(m_instrument->measurements().size()); });
    }
    std::shared_ptr<automation::Object> item(int index) override {
        int id = call("Measurements.item(" + std::to_string(index) + ")", [&] {
            const auto& all = m_instrument->measurements();
            return index >= 1 && index <= static_cast<int>(all.size())
                       ? all[static_cast<std::size_t>(index - 1)].id
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
        int id = call("Application.currentMeasurement()", [&] {
            MeasurementState* m = m_instrument->selectedMeasurement();
            return m ? m->id : 0;
        });
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
        call("Application.setTriggerSetting(" + std::to_string(value) + ")",
             [&] { m_instrument->setTriggerSetting(value); });
    }
    void wait(int value, int timeLimitMs) override {
        // Sweeps complete at once; the virtual time they would take is accounted for.
        long long sweepMs = call(
            "Application.wait(" + std::to_string(value) + "," + std::to_string(timeLimitMs) + ")",
            [&] {
                const ChannelState& c = m_instrument->channel();
                return static_cast<long long>(
                    1000.0 * static_cast<double>(m_instrument->sweepPoints()) / c.ifBandwidthHz);
            });
        m_instrument->clock().wait(
            std::chrono::milliseconds(std::min<long long>(sweepMs, std::max(timeLimitMs, 0))));
    }
};

}  // namespace

std::shared_ptr<automation::Object> makeApplicationObject(std::shared_ptr<Instrument> instrument) {
    unsigned generation = instrument->generation();
    return std::make_shared<SimApplication>(std::move(instrument), generation);
}

}  // namespace sim
