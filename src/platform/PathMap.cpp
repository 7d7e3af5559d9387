#include "platform/PathMap.h"

#include <cctype>

namespace platform {
namespace {

char driveLetter(char letter) {
    return static_cast<char>(std::toupper(static_cast<unsigned char>(letter)));
}

}  // namespace

DrivePathMap::DrivePathMap(std::filesystem::path workingDirectory)
    : m_workingDirectory(std::move(workingDirectory)) {}

void DrivePathMap::mapDrive(char letter, std::filesystem::path root) {
    m_drives[static_cast<char>(std::toupper(static_cast<unsigned char>(letter)))] = std::move(root);
}

void DrivePathMap::mapDrive(char letter, DriveFiles& files) {
    m_remoteDrives[driveLetter(letter)] = &files;
}

DriveFiles* DrivePathMap::driveFiles(const std::string& windowsPath) const {
    if (windowsPath.size() < 2 || windowsPath[1] != ':') {
        return nullptr;
    }
    auto it = m_remoteDrives.find(driveLetter(windowsPath[0]));
    return it == m_remoteDrives.end() ? nullptr : it->second;
}

std::filesystem::path DrivePathMap::toLocal(const std::string& windowsPath) const {
    std::filesystem::path base = m_workingDirectory;
    std::string rest = windowsPath;
    if (rest.size() >= 2 && rest[1] == ':' && std::isalpha(static_cast<unsigned char>(rest[0]))) {
        char letter = driveLetter(rest[0]);
        if (m_remoteDrives.count(letter)) {
            throw std::string("The file " + windowsPath +
                              " is on the analyzer computer, reached only through the instrument");
        }
        auto it = m_drives.find(letter);
        if (it == m_drives.end()) {
            throw std::string("No local folder stands for drive " + std::string(1, letter) +
                              ": of the path " + windowsPath);
        }
        base = it->second;
        rest.erase(0, 2);
    }
    std::filesystem::path result = base;
    std::string part;
    for (char c : rest) {
        if (c == '\\' || c == '/') {
            if (!part.empty() && part != ".") {
                result /= part;
            }
            part.clear();
        } else {
            part += c;
        }
    }
    if (!part.empty() && part != ".") {
        result /= part;
    }
    return result;
}

}  // namespace platform
