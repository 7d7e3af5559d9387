#include "analyzer/remote/RemoteProcessRunner.h"

#include <fstream>
#include <sstream>

#include "platform/UpperCase.h"

namespace remote {
namespace {

std::string trimmed(const std::string& text) {
    const auto first = text.find_first_not_of(" \t");
    return first == std::string::npos
               ? ""
               : text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

// The next argument at `pos`: quoted, or up to the next blank; pos moves past it.
std::string nextArgument(const std::string& text, std::size_t& pos) {
    pos = text.find_first_not_of(" \t", pos);
    if (pos == std::string::npos) {
        pos = text.size();
        return "";
    }
    if (text[pos] == '"') {
        const auto close = text.find('"', pos + 1);
        std::string argument =
            text.substr(pos + 1, (close == std::string::npos ? text.size() : close) - pos - 1);
        pos = close == std::string::npos ? text.size() : close + 1;
        return argument;
    }
    const auto end = std::min(text.find_first_of(" \t", pos), text.size());
    std::string argument = text.substr(pos, end - pos);
    pos = end;
    return argument;
}

// "04/12/2026 14:31:05" -> "04/12/2026  02:31 PM", as "dir" writes it.
std::string dirDate(const std::string& modified) {
    if (modified.size() < 16) {
        return modified;
    }
    int hour = std::atoi(modified.substr(11, 2).c_str());
    const char* half = hour >= 12 ? "PM" : "AM";
    hour = hour % 12 == 0 ? 12 : hour % 12;
    char text[32];
    std::snprintf(text, sizeof text, "%s  %02d:%s %s", modified.substr(0, 10).c_str(), hour,
                  modified.substr(14, 2).c_str(), half);
    return text;
}

}  // namespace

int RemoteProcessRunner::runProgram(const std::string& commandLine) {
    throw "Cannot start " + commandLine +
        ": programs of an analyzer on the LAN are started at the analyzer";
}

int RemoteProcessRunner::runCommand(const std::string& command) {
    std::string text = trimmed(command);
    std::string output;
    if (const auto redirect = text.find('>'); redirect != std::string::npos) {
        std::size_t pos = redirect + 1;
        output = nextArgument(text, pos);
        text = trimmed(text.substr(0, redirect));
    }
    std::size_t pos = 0;
    const std::string verb = platform::upperCased(nextArgument(text, pos));
    std::string path = nextArgument(text, pos);
    while (path.rfind('/', 0) == 0) {
        path = nextArgument(text, pos);
    }
    if (verb == "DEL") {
        return m_drive.remove(path) ? 0 : 1;
    }
    if (verb != "DIR") {
        return 9009;
    }
    const auto [folder, name] = splitWindowsPath(path);
    std::ostringstream listing;
    listing << " Volume in drive C has no label.\r\n\r\n Directory of " << folder << "\r\n\r\n";
    const auto entry = m_drive.find(path);
    if (entry) {
        const std::string size = std::to_string(entry->size);
        listing << dirDate(entry->modified)
                << std::string(size.size() < 18 ? 18 - size.size() : 1, ' ') << size << ' ' << name
                << "\r\n               1 File(s)"
                << std::string(15 - std::min<std::size_t>(14, size.size()), ' ') << size
                << " bytes\r\n";
    } else {
        listing << "File Not Found\r\n";
    }
    if (!output.empty()) {
        std::ofstream out(m_paths.toLocal(output), std::ios::binary | std::ios::trunc);
        out << listing.str();
    }
    return entry ? 0 : 1;
}

}  // namespace remote
