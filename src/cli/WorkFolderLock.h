#pragma once

// One rcvrchar at a time on a working folder and on a simulated analyzer's state: the
// commands that change either hold their locks for the life of the process.

#include <memory>
#include <string>
#include <vector>

#include "cli/AnalyzerOptions.h"
#include "platform/FolderLock.h"

namespace cli {

class WorkFolderLocks {
  public:
    enum class Scope { WorkingFolderAndState, StateOnly };

    // Locks the working folder (when it is one, and the scope asks for it) and the
    // simulator's state folder of the options for `holder` (e.g. "the dialog"); raises the
    // refusal text when another process holds either.
    WorkFolderLocks(const AnalyzerOptions& options, const std::string& holder,
                    Scope scope = Scope::WorkingFolderAndState);

  private:
    std::vector<std::unique_ptr<platform::FolderLock>> m_locks;
};

}  // namespace cli
