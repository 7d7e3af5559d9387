#pragma once

// How the dialog and its runs report a file that could not be written whole: an "Error" box
// naming the file and the reason, a log line, and the failed-write mark that makes the dialog
// end with the failed-run status. Callable from the UI thread and from the worker.

#include <atomic>

#include "platform/OperatorUi.h"
#include "platform/RunSignals.h"
#include "storage/FileFailures.h"

namespace app {

class WriteFailureReport final : public storage::FileFailures {
  public:
    WriteFailureReport(platform::OperatorUi& ui, platform::NoticeSink& notices)
        : m_ui(ui), m_notices(notices) {}

    void report(const std::string& text) override;
    bool anyFailed() const { return m_failed.load(); }

  private:
    platform::OperatorUi& m_ui;
    platform::NoticeSink& m_notices;
    std::atomic<bool> m_failed{false};
};

}  // namespace app
