#pragma once

// A small instrument for the transport tests: echo, a binary block reply, a query that
// blocks until the test releases it, a command taking a block, and one error queue.

#include <condition_variable>
#include <deque>
#include <mutex>
#include <string>
#include <vector>

#include "scpi/Device.h"

namespace lantest {

class FakeDevice : public scpi::Device {
  public:
    std::unique_ptr<scpi::Session> openSession() override;

    // Every message run, in order, and the number of device clears.
    std::vector<std::string> executed() const;
    int clears() const;
    // Lets every WAIT? return, now and later.
    void release();

    // The reply to BLOCK? n: a definite-length block of n bytes that include NL and NUL.
    static std::string blockReply(std::size_t n);

  private:
    class FakeSession;

    mutable std::mutex m_mutex;
    std::condition_variable m_released;
    bool m_open = false;
    std::deque<std::string> m_errors;
    std::vector<std::string> m_executed;
    int m_clears = 0;
};

}  // namespace lantest
