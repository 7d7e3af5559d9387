#pragma once

// The threads LAN servers run on: one io_context for all socket I/O, run by a small pool,
// and one execution thread that owns the instrument. Every call into a scpi::Session is
// posted to the execution thread, so the instrument's state has one owner and a query that
// blocks (a long *OPC?) holds up no accept, read or VXI-11 abort.

#include <asio.hpp>
#include <functional>
#include <list>
#include <mutex>
#include <thread>
#include <vector>

namespace lan {

class ServerContext {
  public:
    explicit ServerContext(unsigned ioThreads = 1);
    ~ServerContext();
    ServerContext(const ServerContext&) = delete;
    ServerContext& operator=(const ServerContext&) = delete;

    asio::io_context& io() { return m_io; }
    // Runs `work` on the execution thread, after all work posted before it.
    void execute(std::function<void()> work) { asio::post(m_execution, std::move(work)); }

    // Stops I/O, closes every server's sockets, then waits for the execution thread to
    // finish the call in progress. Idempotent; servers call it when they go away.
    void stop();

    // Servers register how to close their sockets once I/O has stopped.
    using Closer = std::list<std::function<void()>>::iterator;
    Closer addCloser(std::function<void()> close);
    void removeCloser(Closer closer);

  private:
    asio::io_context m_io;
    asio::io_context m_execution;
    asio::executor_work_guard<asio::io_context::executor_type> m_ioWork;
    asio::executor_work_guard<asio::io_context::executor_type> m_executionWork;
    std::vector<std::thread> m_ioThreads;
    std::thread m_executionThread;
    std::mutex m_mutex;
    std::list<std::function<void()>> m_closers;
    bool m_stopped = false;
};

}  // namespace lan
