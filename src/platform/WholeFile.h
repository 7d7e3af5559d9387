#pragma once

// A file is replaced whole or not at all: the bytes go to "<name>.partial" beside it, which is
// renamed over the file only once everything is on the disk. A failure at any step leaves the
// earlier file as it was and removes the partial one.

#include <cstdio>
#include <filesystem>
#include <memory>
#include <string>
#include <string_view>

namespace platform {

class WholeFile {
  public:
    // Opens the partial file. `what` names the file for the operator (e.g. "the export file
    // RcvrChar_A_Exported.txt"); every failure raises "Cannot write <what> (<target>): <reason>;
    // any earlier file of that name is left as it was".
    WholeFile(std::filesystem::path target, std::string what);
    // Without commit() the partial file is removed and the target left alone.
    ~WholeFile();
    WholeFile(const WholeFile&) = delete;
    WholeFile& operator=(const WholeFile&) = delete;

    void write(std::string_view bytes);
    // Flushes, syncs and closes the partial file, then renames it over the target.
    void commit();

    const std::filesystem::path& target() const { return m_target; }
    static std::filesystem::path partialPath(const std::filesystem::path& target);

  private:
    [[noreturn]] void fail(const std::string& reason);

    struct Closer {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    std::filesystem::path m_target;
    std::filesystem::path m_partial;
    std::string m_what;
    std::unique_ptr<std::FILE, Closer> m_file;
    bool m_committed = false;
};

// The whole file in one call.
void writeWholeFile(const std::filesystem::path& target, std::string_view bytes,
                    const std::string& what);

}  // namespace platform
