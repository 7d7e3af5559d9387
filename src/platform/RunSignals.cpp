#include "platform/RunSignals.h"

namespace platform {

void checkabort(RunSignals& signals, NoticeSink& notices) {
    if (!signals.abortRequested.load()) {
        return;
    }
    notices.postnotice("Characterization Aborted\r\n");
    signals.workerRunning = false;
    throw WorkerAborted{};
}

}  // namespace platform
