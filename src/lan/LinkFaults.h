#pragma once

// Faults a served link shows on purpose, so that clients' handling of a failing link can be
// tested against the servers here. A transport asks before each program message runs what
// becomes of its response; what decides (counts, prefixes) is the owner's business.

#include <atomic>
#include <chrono>
#include <cstdint>
#include <string_view>

namespace lan {

class LinkFaults {
  public:
    enum class Action {
        None,
        // The response is sent, then the connection closed.
        Drop,
        // Half the response is sent, then the connection closed.
        CutResponse,
        // The response is never sent: a raw socket answers nothing more, a VXI-11 read
        // times out until a device clear.
        Stall,
        // `garbage` is sent instead of the response.
        Garbage,
        // The response is sent, then restart() runs and every connection closes.
        Restart,
    };

    // Not a response in any format: no block header, bytes no text encoding takes, NL last.
    static constexpr std::string_view garbage{"\x01\xfe\x80?#\xff\x00\x9b\x7f\n", 10};

    virtual ~LinkFaults() = default;
    // Called on the execution thread once per program message, from every connection.
    virtual Action before(std::string_view message) = 0;
    // Each response goes out in two pieces this far apart; zero sends it whole.
    virtual std::chrono::milliseconds splitDelay() const = 0;

    // Runs the instrument's restart on the execution thread; connections opened before it
    // close at their next step.
    void restart() {
        restartDevice();
        m_restarts.fetch_add(1);
    }
    std::uint64_t restarts() const { return m_restarts.load(); }

  private:
    virtual void restartDevice() = 0;

    std::atomic<std::uint64_t> m_restarts{0};
};

}  // namespace lan
