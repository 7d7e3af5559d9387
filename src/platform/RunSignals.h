#pragma once

// State shared by the dialog and the worker: the abort flag, the worker-running indicator,
// the restart flag, and the notices that the worker hands to the dialog's log.

#include <atomic>
#include <functional>
#include <string>

namespace platform {

class NoticeSink {
  public:
    virtual ~NoticeSink() = default;
    // Appends one log line (the text carries its own "\r\n"); returns once it is appended.
    virtual void postnotice(const std::string& text) = 0;
};

// Where the worker is: the receiver, its segment and its power level, counted from 1.
struct RunStep {
    std::string receiver;
    int segment = 0;
    int segments = 0;
    int level = 0;
    int levels = 0;
};

struct RunSignals {
    std::atomic<bool> abortRequested{false};
    std::atomic<bool> workerRunning{false};
    std::atomic<bool> restartRequested{false};
    // Called on the worker thread before each power level, for a front end that shows
    // progress. Set it before the worker starts; it must not block for long.
    std::function<void(const RunStep&)> onStep;
};

// Thrown by checkabort to unwind the worker; only the worker's top level catches it.
struct WorkerAborted {};

// Worker thread only: when abort was requested, posts "Characterization Aborted\r\n",
// clears the worker-running indicator and throws WorkerAborted.
void checkabort(RunSignals& signals, NoticeSink& notices);

}  // namespace platform
