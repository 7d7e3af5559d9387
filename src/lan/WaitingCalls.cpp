#include "lan/WaitingCalls.h"

namespace lan {

void WaitingCalls::wait(std::uint32_t link, std::chrono::milliseconds timeout, Attempt attempt,
                        Fail fail) {
    if (attempt()) {
        return;
    }
    if (timeout.count() <= 0) {
        fail(false);
        return;
    }
    auto call = std::make_shared<Call>(
        Call{link, std::move(attempt), std::move(fail), asio::steady_timer(m_strand), false});
    call->timer.expires_after(timeout);
    call->timer.async_wait([this, call](std::error_code) {
        // A call answered meanwhile has its timer cancelled, or finds `done` set.
        if (!call->done) {
            finish(*call);
            call->fail(false);
        }
    });
    m_calls.push_back(std::move(call));
}

void WaitingCalls::retry() {
    // An attempt may change state and ask for another round: run it in this loop.
    if (m_retrying) {
        m_retryAgain = true;
        return;
    }
    m_retrying = true;
    do {
        m_retryAgain = false;
        for (std::size_t i = 0; i < m_calls.size(); ++i) {
            auto call = m_calls[i];
            if (!call->done && call->attempt()) {
                finish(*call);
            }
        }
        std::erase_if(m_calls, [](const auto& call) { return call->done; });
    } while (m_retryAgain);
    m_retrying = false;
}

void WaitingCalls::abort(std::uint32_t link) {
    for (std::size_t i = 0; i < m_calls.size(); ++i) {
        auto call = m_calls[i];
        if (!call->done && call->link == link) {
            finish(*call);
            call->fail(true);
        }
    }
    if (!m_retrying) {
        std::erase_if(m_calls, [](const auto& call) { return call->done; });
    }
}

void WaitingCalls::finish(Call& call) {
    call.done = true;
    call.timer.cancel();
}

}  // namespace lan
