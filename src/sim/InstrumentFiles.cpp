// The analyzer computer's files over SCPI (MMEMory). Every path stays inside the simulated
// C: drive: a served instrument must never become a way to read or write the host's files.

#include <fstream>
#include <random>
#include <system_error>

#include "scpi/Block.h"
#include "sim/CommandText.h"
#include "sim/FlashStore.h"
#include "sim/Instrument.h"

namespace sim {
namespace {

scpi::Error refused(const std::string& text, const std::string& why) {
    return scpi::Error{-256, "File name not found; \"" + text + "\" " + why};
}

std::string listingDate(const std::filesystem::path& path) {
    std::time_t when = std::chrono::system_clock::to_time_t(modificationTime(path));
    std::tm local{};
    localtime_r(&when, &local);
    char date[32];
    std::strftime(date, sizeof date, "%m/%d/%Y %H:%M:%S", &local);
    return date;
}

// Writes beside the target and renames over it, so that a file is never left half written.
void writeWhole(const std::filesystem::path& path, std::string_view bytes) {
    std::filesystem::path temporary = path;
    temporary += ".part" + std::to_string(std::random_device{}());
    {
        std::ofstream out(temporary, std::ios::binary | std::ios::trunc);
        out.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        out.close();
        if (!out) {
            std::filesystem::remove(temporary);
            throw scpi::Error{-250, "Mass storage error; cannot write " + path.filename().string()};
        }
    }
    std::error_code error;
    std::filesystem::rename(temporary, path, error);
    if (error) {
        std::filesystem::remove(temporary);
        throw scpi::Error{-250, "Mass storage error; cannot write " + path.filename().string() +
                                    ": " + error.message()};
    }
}

}  // namespace

std::filesystem::path Instrument::drivePath(const std::string& text) const {
    std::string rest = text;
    for (char& c : rest) {
        if (c == '\\') {
            c = '/';
        }
        if (static_cast<unsigned char>(c) < 0x20) {
            throw refused(text, "holds a control character");
        }
    }
    if (rest.size() >= 2 && rest[1] == ':') {
        if (std::toupper(static_cast<unsigned char>(rest[0])) != 'C') {
            throw refused(text, "is on a drive the analyzer does not have");
        }
        rest.erase(0, 2);
    } else if (!rest.empty() && rest[0] == '/') {
        throw refused(text, "is not a path on the analyzer's drive (C:\\...)");
    }
    std::filesystem::path path = driveRoot();
    std::size_t start = 0;
    while (start <= rest.size()) {
        std::size_t slash = std::min(rest.find('/', start), rest.size());
        std::string part = rest.substr(start, slash - start);
        start = slash + 1;
        if (part.empty() || part == ".") {
            continue;
        }
        if (part == ".." || part.find(':') != std::string::npos) {
            throw refused(text, "leaves the analyzer's drive");
        }
        path /= part;
        if (std::filesystem::is_symlink(std::filesystem::symlink_status(path))) {
            throw refused(text, "passes through a link");
        }
    }
    return path;
}

void Instrument::addFileCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;
    namespace fs = std::filesystem;

    t.add("MMEMory:TRANsfer", [this](C& c) {
        const std::string name = c.parameters.string();
        const std::string_view bytes = c.parameters.block();
        const fs::path path = drivePath(name);
        if (!fs::is_directory(path.parent_path())) {
            throw refused(name, "is in a folder that does not exist");
        }
        if (fs::is_directory(path)) {
            throw refused(name, "is a folder");
        }
        writeWhole(path, bytes);
        return std::string();
    });
    t.add("MMEMory:TRANsfer?", [this](C& c) {
        const std::string name = c.parameters.string();
        const fs::path path = drivePath(name);
        if (!fs::is_regular_file(path)) {
            throw refused(name, "does not exist");
        }
        std::ifstream in(path, std::ios::binary);
        std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
        if (bytes.size() > scpi::maxBlockBytes) {
            throw scpi::Error{-223, "Too much data; " + name + " exceeds a block"};
        }
        std::string reply;
        scpi::appendBlock(reply, bytes);
        return reply;
    });
    t.add("MMEMory:CATalog?", [this](C& c) {
        const std::string name = c.parameters.atEnd() ? std::string("C:\\") : c.parameters.string();
        const fs::path folder = drivePath(name);
        if (!fs::is_directory(folder)) {
            throw refused(name, "is not a folder");
        }
        std::vector<fs::directory_entry> entries;
        for (const auto& entry : fs::directory_iterator(folder)) {
            if (!entry.is_symlink() && entry.path().extension().string().rfind(".part", 0) != 0) {
                entries.push_back(entry);
            }
        }
        std::sort(entries.begin(), entries.end());
        std::uintmax_t used = 0;
        std::string list;
        for (const auto& entry : entries) {
            const bool isFolder = entry.is_directory();
            const std::uintmax_t size = isFolder ? 0 : entry.file_size();
            used += size;
            list += ",\"" + entry.path().filename().string() + "," + (isFolder ? "DIR" : "FILE") +
                    "," + std::to_string(size) + "," + listingDate(entry.path()) + "\"";
        }
        const fs::space_info space = fs::space(folder);
        return std::to_string(used) + "," + std::to_string(space.available) + list;
    });
    t.add("MMEMory:DELete", [this](C& c) {
        const std::string name = c.parameters.string();
        const fs::path path = drivePath(name);
        if (!fs::is_regular_file(path)) {
            throw refused(name, fs::is_directory(path) ? "is a folder" : "does not exist");
        }
        fs::remove(path);
        return std::string();
    });
    t.add("MMEMory:MDIRectory", [this](C& c) {
        const std::string name = c.parameters.string();
        const fs::path path = drivePath(name);
        if (path == driveRoot() || fs::exists(path)) {
            throw scpi::Error{-257, "File name error; \"" + name + "\" exists"};
        }
        if (!fs::is_directory(path.parent_path())) {
            throw refused(name, "is in a folder that does not exist");
        }
        fs::create_directory(path);
        return std::string();
    });
}

}  // namespace sim
