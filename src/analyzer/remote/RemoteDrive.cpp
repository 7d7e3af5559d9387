#include "analyzer/remote/RemoteDrive.h"

#include "scpi/Block.h"
#include "scpi/ProgramMessage.h"

namespace remote {
namespace {

// The quoted entries of an MMEM:CAT? reply: "<name>,FILE|DIR,<size>,<date time>".
std::vector<std::string> catalogEntries(std::string_view reply) {
    std::vector<std::string> entries;
    std::size_t pos = 0;
    while ((pos = reply.find('"', pos)) != std::string_view::npos) {
        std::string entry;
        ++pos;
        while (pos < reply.size()) {
            if (reply[pos] == '"') {
                if (pos + 1 < reply.size() && reply[pos + 1] == '"') {
                    entry += '"';
                    pos += 2;
                    continue;
                }
                break;
            }
            entry += reply[pos++];
        }
        ++pos;
        entries.push_back(std::move(entry));
    }
    return entries;
}

}  // namespace

std::pair<std::string, std::string> splitWindowsPath(const std::string& windowsPath) {
    const auto slash = windowsPath.find_last_of("\\/");
    if (slash == std::string::npos) {
        return {"C:\\", windowsPath};
    }
    return {windowsPath.substr(0, slash), windowsPath.substr(slash + 1)};
}

std::optional<DriveEntry> RemoteDrive::find(const std::string& windowsPath) {
    const auto [folder, name] = splitWindowsPath(windowsPath);
    const std::string reply = m_link->query("MMEM:CAT? " + scpi::quotedString(folder),
                                            "listing the analyzer's folder " + folder);
    for (const std::string& entry : catalogEntries(reply)) {
        // The name may hold commas; the three fields after it do not.
        const auto third = entry.rfind(',');
        const auto second = third == std::string::npos ? third : entry.rfind(',', third - 1);
        const auto first = second == std::string::npos ? second : entry.rfind(',', second - 1);
        if (first == std::string::npos) {
            continue;
        }
        if (entry.substr(0, first) == name &&
            entry.substr(first + 1, second - first - 1) == "FILE") {
            DriveEntry found;
            found.name = name;
            found.size = std::stoull("0" + entry.substr(second + 1, third - second - 1));
            found.modified = entry.substr(third + 1);
            return found;
        }
    }
    return std::nullopt;
}

std::string RemoteDrive::transfer(const std::string& windowsPath, const std::string& doing) {
    const std::string reply = m_link->query("MMEM:TRAN? " + scpi::quotedString(windowsPath), doing);
    std::optional<scpi::BlockHeader> header;
    try {
        header = scpi::readBlockHeader(reply);
    } catch (const scpi::Error&) {
    }
    if (!header || header->headerBytes + header->dataBytes != reply.size()) {
        throw doing + " from " + m_link->resource() + ": the reply is not one block";
    }
    return reply.substr(header->headerBytes);
}

void RemoteDrive::write(const std::string& windowsPath, std::string_view bytes) {
    std::string message = "MMEM:TRAN " + scpi::quotedString(windowsPath) + ",";
    scpi::appendBlock(message, bytes);
    m_link->command(message, "writing the analyzer's file " + windowsPath);
    const std::string stored =
        transfer(windowsPath, "reading back the analyzer's file " + windowsPath);
    if (stored != bytes) {
        throw "Cannot write the characterization data file " + windowsPath + " on " +
            m_link->resource() + ": the analyzer holds " + std::to_string(stored.size()) +
            " bytes that differ from the " + std::to_string(bytes.size()) + " bytes sent";
    }
}

std::optional<std::string> RemoteDrive::read(const std::string& windowsPath) {
    if (!find(windowsPath)) {
        return std::nullopt;
    }
    return transfer(windowsPath, "reading the analyzer's file " + windowsPath);
}

bool RemoteDrive::remove(const std::string& windowsPath) {
    if (!find(windowsPath)) {
        return false;
    }
    m_link->command("MMEM:DEL " + scpi::quotedString(windowsPath),
                    "deleting the analyzer's file " + windowsPath);
    return true;
}

}  // namespace remote
