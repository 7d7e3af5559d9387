#pragma once

// The fixed waits of the analyzer protocol. A real clock sleeps; a virtual clock only
// counts, so runs against the simulator take no wall time.

#include <atomic>
#include <chrono>

namespace platform {

class Clock {
  public:
    virtual ~Clock() = default;
    virtual void wait(std::chrono::milliseconds duration) = 0;
    // Total of every wait asked for so far.
    virtual std::chrono::milliseconds totalWaited() const = 0;
};

class RealClock final : public Clock {
  public:
    void wait(std::chrono::milliseconds duration) override;
    std::chrono::milliseconds totalWaited() const override;

  private:
    std::atomic<long long> m_totalMs{0};
};

class VirtualClock final : public Clock {
  public:
    void wait(std::chrono::milliseconds duration) override;
    std::chrono::milliseconds totalWaited() const override;

  private:
    std::atomic<long long> m_totalMs{0};
};

}  // namespace platform
