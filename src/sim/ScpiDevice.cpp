#include "sim/ScpiDevice.h"

#include "sim/Instrument.h"

namespace sim {
namespace {

class Session final : public scpi::Session {
  public:
    explicit Session(std::shared_ptr<Instrument> instrument)
        : m_instrument(std::move(instrument)) {}

    std::string execute(std::string_view message) override {
        return m_instrument->execute(message);
    }
    std::uint8_t statusByte(bool messageAvailable) override {
        return m_instrument->statusByte(messageAvailable);
    }
    void reportError(int code, std::string_view message) override {
        m_instrument->reportError(code, std::string(message));
    }
    // The instrument keeps no input of a session's own; the transport drops what it holds.
    void clear() override {}

  private:
    std::shared_ptr<Instrument> m_instrument;
};

class Device final : public scpi::Device {
  public:
    explicit Device(std::shared_ptr<Instrument> instrument) : m_instrument(std::move(instrument)) {}
    std::unique_ptr<scpi::Session> openSession() override {
        return std::make_unique<Session>(m_instrument);
    }

  private:
    std::shared_ptr<Instrument> m_instrument;
};

}  // namespace

std::unique_ptr<scpi::Device> makeScpiDevice(std::shared_ptr<Instrument> instrument) {
    return std::make_unique<Device>(std::move(instrument));
}

}  // namespace sim
