#include "sim/FlashStore.h"

#include <algorithm>
#include <bit>
#include <cctype>
#include <fstream>

#include "scpi/ProgramMessage.h"

namespace sim {
namespace {

std::string checkedName(const std::string& name, const char* what) {
    bool ok = !name.empty() && name.size() <= 64 && name != "." && name != "..";
    std::string upper;
    for (char c : name) {
        unsigned char u = static_cast<unsigned char>(c);
        ok = ok && (std::isalnum(u) || c == '_' || c == '-' || c == '.');
        upper += static_cast<char>(std::toupper(u));
    }
    if (!ok) {
        throw scpi::Error{
            -224, std::string("Illegal parameter value; bad flash ") + what + " \"" + name + "\""};
    }
    return upper;
}

}  // namespace

std::optional<std::vector<std::uint16_t>> readWordFile(const std::filesystem::path& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        return std::nullopt;
    }
    in.seekg(0, std::ios::end);
    std::streamoff size = in.tellg();
    in.seekg(0);
    std::vector<std::uint16_t> words(static_cast<std::size_t>(size) / 2);
    in.read(reinterpret_cast<char*>(words.data()), static_cast<std::streamsize>(words.size() * 2));
    if constexpr (std::endian::native == std::endian::big) {
        for (auto& w : words) {
            w = static_cast<std::uint16_t>((w >> 8) | (w << 8));
        }
    }
    return words;
}

void writeWordFile(const std::filesystem::path& path, std::span<const std::uint16_t> words,
                   std::chrono::system_clock::time_point when) {
    {
        std::ofstream out(path, std::ios::binary | std::ios::trunc);
        if (!out) {
            throw std::string("simulated analyzer cannot write " + path.string());
        }
        if constexpr (std::endian::native == std::endian::big) {
            for (auto w : words) {
                char bytes[2] = {static_cast<char>(w & 0xFF), static_cast<char>(w >> 8)};
                out.write(bytes, 2);
            }
        } else {
            out.write(reinterpret_cast<const char*>(words.data()),
                      static_cast<std::streamsize>(words.size() * 2));
        }
    }
    std::filesystem::last_write_time(path, std::chrono::file_clock::from_sys(when));
}

std::chrono::system_clock::time_point modificationTime(const std::filesystem::path& path) {
    return std::chrono::time_point_cast<std::chrono::system_clock::duration>(
        std::chrono::file_clock::to_sys(std::filesystem::last_write_time(path)));
}

FlashStore::FlashStore(std::filesystem::path root) : m_root(std::move(root)) {
    std::filesystem::create_directories(m_root);
}

std::filesystem::path FlashStore::pathOf(const std::string& file, const std::string& name) const {
    return m_root / checkedName(file, "file name") /
           (checkedName(name, "calibration name") + ".bin");
}

void FlashStore::write(const std::string& file, const std::string& name,
                       std::span<const std::uint16_t> words, TimePoint when) {
    auto path = pathOf(file, name);
    std::filesystem::create_directories(path.parent_path());
    writeWordFile(path, words, when);
}

std::optional<std::vector<std::uint16_t>> FlashStore::read(const std::string& file,
                                                           const std::string& name) const {
    return readWordFile(pathOf(file, name));
}

bool FlashStore::erase(const std::string& file, const std::string& name) {
    std::error_code ec;
    return std::filesystem::remove(pathOf(file, name), ec);
}

std::vector<FlashStore::Entry> FlashStore::catalog() const {
    std::vector<Entry> entries;
    for (const auto& folder : std::filesystem::directory_iterator(m_root)) {
        if (!folder.is_directory()) {
            continue;
        }
        for (const auto& item : std::filesystem::directory_iterator(folder.path())) {
            if (item.path().extension() != ".bin") {
                continue;
            }
            entries.push_back({folder.path().filename().string(), item.path().stem().string(),
                               modificationTime(item.path()),
                               static_cast<std::size_t>(item.file_size() / 2)});
        }
    }
    std::sort(entries.begin(), entries.end(), [](const Entry& a, const Entry& b) {
        return a.file != b.file ? a.file < b.file : a.name < b.name;
    });
    return entries;
}

}  // namespace sim
