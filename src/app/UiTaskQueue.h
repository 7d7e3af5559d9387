#pragma once

// The UI thread's inbox. Other threads hand it work and wait until the UI thread has done
// it (how the worker's notices reach the log); the UI thread's loop runs the work between
// its own events. Work handed in on the UI thread itself runs at once.

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>

namespace app {

class UiTaskQueue {
  public:
    // The constructing thread is the UI thread.
    UiTaskQueue();

    bool onUiThread() const { return std::this_thread::get_id() == m_uiThread; }

    // Runs task on the UI thread and returns once it has run. The caller's thread waits;
    // an exception thrown by the task stays on the UI thread (it ends the UI loop there).
    void runSynchronously(std::function<void()> task);

    // Queues task for the UI thread without waiting for it.
    void post(std::function<void()> task);

    // UI thread: runs every task handed in so far; when none is waiting, waits up to
    // timeout for one or for wake(). Returns true when something ran or a wake came.
    bool runPending(std::chrono::milliseconds timeout);

    // Makes a waiting runPending return early (e.g. the worker has ended).
    void wake();

  private:
    struct Item {
        std::function<void()> task;
        // Set when the caller waits for the task to have run.
        std::shared_ptr<bool> done;
    };

    std::thread::id m_uiThread;
    std::mutex m_mutex;
    std::condition_variable m_arrived;
    std::condition_variable m_finished;
    std::deque<Item> m_items;
    bool m_woken = false;
};

}  // namespace app
