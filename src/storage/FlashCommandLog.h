#pragma once

// ".\FlashCommands.txt": the append-only record of every flash-changing command sent, the
// notes around them and the analyzer errors that followed. Lines end with CR LF, as on the
// analyzer's own computer. The dialog and the worker share one log; the run rules keep them
// from writing at the same time, the lock only keeps lines whole if they ever do.

#include <mutex>
#include <string>

#include "platform/PathMap.h"

namespace storage {

class FlashCommandLog {
  public:
    static constexpr const char* kWindowsPath = ".\\FlashCommands.txt";

    explicit FlashCommandLog(const platform::PathMap& paths);

    // Creates the log afresh with the line "Initialized file"; raises an error text naming
    // the file and the reason when it cannot be written.
    void create();
    // Appends one entry; line feeds inside it start new lines. A log that cannot be opened loses
    // the line and nothing else: the flash step it records goes on.
    void append(const std::string& line);

  private:
    const platform::PathMap& m_paths;
    std::mutex m_mutex;
};

}  // namespace storage
