#include "app/UiTaskQueue.h"

namespace app {

UiTaskQueue::UiTaskQueue() : m_uiThread(std::this_thread::get_id()) {}

void UiTaskQueue::runSynchronously(std::function<void()> task) {
    if (onUiThread()) {
        task();
        return;
    }
    auto done = std::make_shared<bool>(false);
    std::unique_lock lock(m_mutex);
    m_items.push_back({std::move(task), done});
    m_arrived.notify_all();
    m_finished.wait(lock, [&] { return *done; });
}

void UiTaskQueue::post(std::function<void()> task) {
    std::lock_guard lock(m_mutex);
    m_items.push_back({std::move(task), nullptr});
    m_arrived.notify_all();
}

bool UiTaskQueue::runPending(std::chrono::milliseconds timeout) {
    std::deque<Item> batch;
    {
        std::unique_lock lock(m_mutex);
        m_arrived.wait_for(lock, timeout, [&] { return !m_items.empty() || m_woken; });
        bool woken = m_woken;
        m_woken = false;
        batch.swap(m_items);
        if (batch.empty()) {
            return woken;
        }
    }
    // Every waiting caller is released, also when a task throws: the rest of the batch goes
    // back to the front of the queue for the next call.
    while (!batch.empty()) {
        Item item = std::move(batch.front());
        batch.pop_front();
        auto release = [&] {
            if (item.done) {
                std::lock_guard lock(m_mutex);
                *item.done = true;
                m_finished.notify_all();
            }
        };
        try {
            item.task();
        } catch (...) {
            release();
            std::lock_guard lock(m_mutex);
            m_items.insert(m_items.begin(), std::make_move_iterator(batch.begin()),
                           std::make_move_iterator(batch.end()));
            throw;
        }
        release();
    }
    return true;
}

void UiTaskQueue::wake() {
    std::lock_guard lock(m_mutex);
    m_woken = true;
    m_arrived.notify_all();
}

}  // namespace app
