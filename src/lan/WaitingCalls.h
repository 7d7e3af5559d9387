#pragma once

// RPC calls that cannot be answered yet (a read with nothing to read, a write to a device
// another link has locked). Each waits on the server's state strand: it is tried again after
// every change of state, and fails when its time runs out or its link is aborted.

#include <asio.hpp>
#include <chrono>
#include <cstdint>
#include <functional>
#include <memory>
#include <vector>

namespace lan {

class WaitingCalls {
  public:
    // Answers the call and returns true, or returns false to go on waiting.
    using Attempt = std::function<bool()>;
    // Answers the call with an error; `aborted` tells an abort from a timeout.
    using Fail = std::function<void(bool aborted)>;

    explicit WaitingCalls(asio::strand<asio::io_context::executor_type> strand)
        : m_strand(std::move(strand)) {}

    // Tries once at once; a timeout of zero fails right after that.
    void wait(std::uint32_t link, std::chrono::milliseconds timeout, Attempt attempt, Fail fail);
    void retry();
    void abort(std::uint32_t link);

  private:
    struct Call {
        std::uint32_t link;
        Attempt attempt;
        Fail fail;
        asio::steady_timer timer;
        bool done = false;
    };
    void finish(Call& call);

    asio::strand<asio::io_context::executor_type> m_strand;
    std::vector<std::shared_ptr<Call>> m_calls;
    bool m_retrying = false;
    bool m_retryAgain = false;
};

}  // namespace lan
