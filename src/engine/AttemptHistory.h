#pragma once

// Files of an earlier attempt are kept, not overwritten: before a new attempt writes a
// receiver's raw files, or a new dialog its flash command log, the earlier ones move into the
// dialog run's history folder.

#include <filesystem>
#include <string>

namespace engine {

// Moves file, when it exists, to historyFolder/"<stem>.<n><extension>" with the first free
// attempt number n from 1; the folder is created as needed. Raises an error text naming the
// file, the folder and the reason when it cannot.
void keepEarlierAttempt(const std::filesystem::path& file,
                        const std::filesystem::path& historyFolder);

}  // namespace engine
