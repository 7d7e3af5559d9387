#pragma once

// The analyzer's flash file store, persisted under a folder of the state directory: one
// binary file of little-endian words per calibration, in a folder per flash file. A
// calibration's date is its file's modification time, so it survives restarts and runs.
// Flash file and calibration names are case-insensitive (kept in capitals).

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace sim {

class FlashStore {
  public:
    using TimePoint = std::chrono::system_clock::time_point;

    struct Entry {
        std::string file;
        std::string name;
        TimePoint stored;
        std::size_t words = 0;
    };

    explicit FlashStore(std::filesystem::path root);

    // Names are letters, digits, '_', '-' and '.', at most 64 characters; others raise
    // scpi::Error -224 naming the name.
    void write(const std::string& file, const std::string& name,
               std::span<const std::uint16_t> words, TimePoint when);
    std::optional<std::vector<std::uint16_t>> read(const std::string& file,
                                                   const std::string& name) const;
    bool erase(const std::string& file, const std::string& name);
    // Sorted by flash file, then name.
    std::vector<Entry> catalog() const;

  private:
    std::filesystem::path pathOf(const std::string& file, const std::string& name) const;

    std::filesystem::path m_root;
};

// Reads a file of little-endian 16-bit words; nullopt when it cannot be opened.
std::optional<std::vector<std::uint16_t>> readWordFile(const std::filesystem::path& path);
// Writes words as little-endian bytes (truncating) and dates the file.
void writeWordFile(const std::filesystem::path& path, std::span<const std::uint16_t> words,
                   std::chrono::system_clock::time_point when);
std::chrono::system_clock::time_point modificationTime(const std::filesystem::path& path);

}  // namespace sim
