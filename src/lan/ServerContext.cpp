#include "lan/ServerContext.h"

namespace lan {

ServerContext::ServerContext(unsigned ioThreads)
    : m_ioWork(asio::make_work_guard(m_io)), m_executionWork(asio::make_work_guard(m_execution)) {
    for (unsigned i = 0; i < std::max(ioThreads, 1u); ++i) {
        m_ioThreads.emplace_back([this] { m_io.run(); });
    }
    m_executionThread = std::thread([this] { m_execution.run(); });
}

ServerContext::~ServerContext() {
    stop();
}

void ServerContext::stop() {
    std::lock_guard lock(m_mutex);
    if (m_stopped) {
        return;
    }
    m_stopped = true;
    m_io.stop();
    for (auto& thread : m_ioThreads) {
        thread.join();
    }
    // No I/O thread runs now, so sockets may be closed from here.
    for (auto& close : m_closers) {
        close();
    }
    m_execution.stop();
    m_executionThread.join();
}

ServerContext::Closer ServerContext::addCloser(std::function<void()> close) {
    std::lock_guard lock(m_mutex);
    return m_closers.insert(m_closers.end(), std::move(close));
}

void ServerContext::removeCloser(Closer closer) {
    std::lock_guard lock(m_mutex);
    m_closers.erase(closer);
}

}  // namespace lan
