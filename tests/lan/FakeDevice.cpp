#include "FakeDevice.h"

namespace lantest {

class FakeDevice::FakeSession : public scpi::Session {
  public:
    explicit FakeSession(FakeDevice& device) : m_device(device) {}

    std::string execute(std::string_view message) override {
        std::unique_lock lock(m_device.m_mutex);
        m_device.m_executed.emplace_back(message);
        const auto space = message.find(' ');
        const std::string_view header = message.substr(0, space);
        const std::string_view argument =
            space == std::string_view::npos ? std::string_view() : message.substr(space + 1);
        if (header == "*IDN?") {
            return "FAKE,LAN-TEST,0,1.0";
        }
        if (header == "ECHO?") {
            return std::string(argument);
        }
        if (header == "BLOCK?") {
            return blockReply(std::stoul(std::string(argument)));
        }
        if (header == "WAIT?") {
            m_device.m_released.wait(lock, [this] { return m_device.m_open; });
            return "1";
        }
        if (header == "SYST:ERR?") {
            if (m_device.m_errors.empty()) {
                return "0,\"No error\"";
            }
            std::string entry = std::move(m_device.m_errors.front());
            m_device.m_errors.pop_front();
            return entry;
        }
        if (header == "CMD" || header == "DATA" || header == "*TRG") {
            return "";
        }
        m_device.m_errors.push_back("-113,\"Undefined header\"");
        return "";
    }

    std::uint8_t statusByte(bool messageAvailable) override {
        std::lock_guard lock(m_device.m_mutex);
        return static_cast<std::uint8_t>((m_device.m_errors.empty() ? 0 : 0x04) |
                                         (messageAvailable ? 0x10 : 0));
    }

    void reportError(int code, std::string_view message) override {
        std::lock_guard lock(m_device.m_mutex);
        m_device.m_errors.push_back(std::to_string(code) + ",\"" + std::string(message) + "\"");
    }

    void clear() override {
        std::lock_guard lock(m_device.m_mutex);
        ++m_device.m_clears;
    }

  private:
    FakeDevice& m_device;
};

std::unique_ptr<scpi::Session> FakeDevice::openSession() {
    return std::make_unique<FakeSession>(*this);
}

std::vector<std::string> FakeDevice::executed() const {
    std::lock_guard lock(m_mutex);
    return m_executed;
}

int FakeDevice::clears() const {
    std::lock_guard lock(m_mutex);
    return m_clears;
}

void FakeDevice::release() {
    {
        std::lock_guard lock(m_mutex);
        m_open = true;
    }
    m_released.notify_all();
}

std::string FakeDevice::blockReply(std::size_t n) {
    const std::string length = std::to_string(n);
    std::string block = "#" + std::to_string(length.size()) + length;
    block.reserve(block.size() + n);
    for (std::size_t i = 0; i < n; ++i) {
        block += static_cast<char>(i * 7 % 256);
    }
    return block;
}

}  // namespace lantest
