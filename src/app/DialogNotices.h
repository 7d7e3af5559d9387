#pragma once

// postnotice for every thread: the text is handed to the dialog's notice handler on the UI
// thread, and the caller returns once it has been appended.

#include <functional>
#include <string>

#include "app/UiTaskQueue.h"
#include "platform/RunSignals.h"

namespace app {

class DialogNotices final : public platform::NoticeSink {
  public:
    using Handler = std::function<void(const std::string& text)>;

    DialogNotices(UiTaskQueue& queue, Handler handler)
        : m_queue(queue), m_handler(std::move(handler)) {}

    void postnotice(const std::string& text) override;

  private:
    UiTaskQueue& m_queue;
    Handler m_handler;
};

}  // namespace app
