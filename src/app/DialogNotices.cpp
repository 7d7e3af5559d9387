#include "app/DialogNotices.h"

namespace app {

void DialogNotices::postnotice(const std::string& text) {
    m_queue.runSynchronously([this, &text] { m_handler(text); });
}

}  // namespace app
