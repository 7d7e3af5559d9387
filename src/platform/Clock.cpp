#include "platform/Clock.h"

#include <thread>

namespace platform {

void RealClock::wait(std::chrono::milliseconds duration) {
    m_totalMs += duration.count();
    std::this_thread::sleep_for(duration);
}

std::chrono::milliseconds RealClock::totalWaited() const {
    return std::chrono::milliseconds(m_totalMs.load());
}

void VirtualClock::wait(std::chrono::milliseconds duration) {
    m_totalMs += duration.count();
}

std::chrono::milliseconds VirtualClock::totalWaited() const {
    return std::chrono::milliseconds(m_totalMs.load());
}

}  // namespace platform
