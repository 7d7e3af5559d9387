#pragma once

// Every exchange with the simulated instrument, in order: SCPI commands ("> "), their
// replies ("< ", only when not empty), queued errors ("! ") and automation calls ("@ ").
// Very long texts (a flash array write of thousands of words) are kept abbreviated.
// Thread-safe; an optional file receives each line as it is recorded.

#include <filesystem>
#include <fstream>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

namespace sim {

class Transcript {
  public:
    static constexpr std::size_t maxLineLength = 4000;

    void record(char kind, std::string_view text);
    std::vector<std::string> lines() const;
    void clear();
    // Appends every later line to the file; raises an error text when it cannot be opened.
    void setFile(const std::filesystem::path& path);

  private:
    mutable std::mutex m_mutex;
    std::vector<std::string> m_lines;
    std::ofstream m_file;
};

}  // namespace sim
