#pragma once

// The analyzer measurement application's automation objects, as the proxy uses them.
// A back end (the simulator, later a real instrument link) implements these classes.
// Objects are reference counted through std::shared_ptr, as the application's objects are.
// "Asking an object for another interface" is queryInterface<T>(), which yields nullptr
// when the object does not offer T; callers must check.

#include <memory>
#include <span>
#include <string>
#include <vector>

namespace automation {

// Any automation object; concrete objects derive from the interfaces they offer.
class Object {
  public:
    virtual ~Object() = default;
};

template <class Interface>
std::shared_ptr<Interface> queryInterface(const std::shared_ptr<Object>& object) {
    return std::dynamic_pointer_cast<Interface>(object);
}

class ScpiParser : public virtual Object {
  public:
    // One command in, the whole reply out (empty for commands without a reply).
    virtual std::string parse(const std::string& command) = 0;
};

class MeasurementData : public virtual Object {
  public:
    // Reads one trace. `points` holds the expected length on entry and the length the
    // analyzer delivered on return; at most destination.size() values are written.
    // Returns 0 on success, a nonzero failure status otherwise.
    virtual long readData(int location, int formatCode, long& points,
                          std::span<float> destination) = 0;
};

class Measurement : public virtual Object {
  public:
    virtual std::string name() = 0;
    // Receiver and source port, e.g. "R1,PORT 1".
    virtual std::string parameter() = 0;
    // The two one-time settings the proxy makes (1 and -1).
    virtual void setFirstSetting(int value) = 0;
    virtual void setSecondSetting(int value) = 0;
};

class MeasurementCollection : public virtual Object {
  public:
    virtual int count() = 0;
    // index from 1 to count(); nullptr when out of range.
    virtual std::shared_ptr<Object> item(int index) = 0;
};

// Seven columns per segment: on, points, start Hz, stop Hz, IF bandwidth Hz, 0, power dBm.
struct SegmentRow {
    double on = 1;
    double points = 0;
    double start = 0;
    double stop = 0;
    double ifBandwidth = 0;
    double reserved = 0;
    double power = 0;
};

class SegmentTable : public virtual Object {
  public:
    virtual void writeTable(const std::vector<SegmentRow>& rows) = 0;
    virtual void setPerSegmentBandwidth(int on) = 0;
    virtual void enablePerSegmentPower() = 0;
};

class Channel : public virtual Object {
  public:
    // 0 linear, 2 power sweep, 3 CW, 4 segment sweep.
    virtual void setSweepType(int code) = 0;
    virtual double startFrequency() = 0;
    virtual double stopFrequency() = 0;
    virtual void setCwFrequency(double hz) = 0;
    virtual double startPower() = 0;
    virtual double stopPower() = 0;
    virtual void setStartPower(double dbm) = 0;
    virtual void setStopPower(double dbm) = 0;
    virtual void setIfBandwidth(double hz) = 0;
    virtual long numberOfPoints() = 0;
    virtual void setNumberOfPoints(long points) = 0;
    // mode 0 automatic, 1 manual; port from 1 to the port count.
    virtual void setAttenuatorMode(int port, int mode) = 0;
    virtual void setTriggerSetting(int value) = 0;
    virtual void singleSweep() = 0;
    virtual void setContinuousSweep(bool on) = 0;
    virtual void setIfBandwidthSwitch(bool on) = 0;
    virtual std::shared_ptr<Object> segmentTable() = 0;
};

class Application : public virtual Object {
  public:
    // nullptr when the application cannot hand out a parser.
    virtual std::shared_ptr<Object> scpiParser() = 0;
    // The argument-less operation that starts preparation and channel set-up.
    virtual void reset() = 0;
    // The operation preparation calls with the argument 1.
    virtual void preset(int value) = 0;
    virtual std::shared_ptr<Object> activeChannel() = 0;
    virtual std::shared_ptr<Object> currentMeasurement() = 0;
    virtual std::shared_ptr<Object> measurements() = 0;
    virtual void setTriggerSetting(int value) = 0;
    // Returns when the sweep is done or the time limit has passed.
    virtual void wait(int value, int timeLimitMs) = 0;
};

}  // namespace automation
