#pragma once

#include "engine/RunContext.h"

namespace engine {

// The body of the worker thread: characterizes every receiver of the context in order.
// Returns the thread's exit code: 0 after a complete run, 1 after an error (shown in an
// "Error" box, "Error in Cal" posted) or an abort. Clears signals.workerRunning as its
// last act on every path.
int runCharacterization(RunContext& context);

}  // namespace engine
