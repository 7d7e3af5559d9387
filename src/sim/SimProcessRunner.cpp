#include "sim/SimProcessRunner.h"

#include <cctype>
#include <chrono>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "sim/SimulatedAnalyzer.h"

namespace sim {
namespace {

std::string lower(std::string text) {
    for (auto& c : text) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return text;
}

std::string trim(const std::string& text) {
    auto first = text.find_first_not_of(" \t");
    if (first == std::string::npos) {
        return "";
    }
    return text.substr(first, text.find_last_not_of(" \t") - first + 1);
}

// The first argument of a command line: quoted, or up to the next blank.
std::string firstArgument(const std::string& text, std::size_t& end) {
    std::string rest = text;
    std::size_t start = rest.find_first_not_of(" \t");
    if (start == std::string::npos) {
        end = rest.size();
        return "";
    }
    if (rest[start] == '"') {
        std::size_t close = rest.find('"', start + 1);
        end = close == std::string::npos ? rest.size() : close + 1;
        return rest.substr(start + 1,
                           (close == std::string::npos ? rest.size() : close) - start - 1);
    }
    end = rest.find_first_of(" \t", start);
    if (end == std::string::npos) {
        end = rest.size();
    }
    return rest.substr(start, end - start);
}

std::string folderOf(const std::string& windowsPath) {
    auto slash = windowsPath.find_last_of('\\');
    return slash == std::string::npos ? "." : windowsPath.substr(0, slash);
}

std::string nameOf(const std::string& windowsPath) {
    auto slash = windowsPath.find_last_of('\\');
    return slash == std::string::npos ? windowsPath : windowsPath.substr(slash + 1);
}

}  // namespace

SimProcessRunner::SimProcessRunner(SimulatedAnalyzer& analyzer, const platform::PathMap& paths)
    : m_analyzer(analyzer), m_paths(paths) {}

int SimProcessRunner::runProgram(const std::string& commandLine) {
    std::size_t end = 0;
    std::string program = firstArgument(commandLine, end);
    std::string expected = m_analyzer.scenario().appDir + "\\restartapp.exe";
    if (lower(program) != lower(expected)) {
        throw std::string("The system cannot find the file specified: " + program);
    }
    m_analyzer.restartApplication();
    return 0;
}

int SimProcessRunner::runCommand(const std::string& command) {
    std::string text = trim(command);
    std::string output;
    if (auto redirect = text.find('>'); redirect != std::string::npos) {
        std::size_t end = 0;
        output = firstArgument(text.substr(redirect + 1), end);
        text = trim(text.substr(0, redirect));
    }
    std::string verb = lower(text.substr(0, text.find(' ')));
    std::string rest = text.size() > verb.size() ? text.substr(verb.size()) : "";
    if (verb == "dir") {
        // Switches such as /-C come before the path.
        std::string path;
        std::size_t end = 0;
        do {
            path = firstArgument(rest, end);
            rest = rest.substr(end);
        } while (path.rfind('/', 0) == 0);
        return listFile(path, output);
    }
    if (verb == "del") {
        std::size_t end = 0;
        return deleteFile(firstArgument(rest, end));
    }
    if (!output.empty()) {
        std::ofstream(m_paths.toLocal(output)).flush();
    }
    return 9009;
}

int SimProcessRunner::listFile(const std::string& windowsPath, const std::string& output) {
    std::ostringstream listing;
    listing << " Volume in drive C has no label.\r\n"
            << " Volume Serial Number is 5A1C-0E77\r\n\r\n"
            << " Directory of " << folderOf(windowsPath) << "\r\n\r\n";
    auto local = m_paths.toLocal(windowsPath);
    int status = 0;
    if (std::filesystem::is_regular_file(local)) {
        auto modified = std::chrono::file_clock::to_sys(std::filesystem::last_write_time(local));
        std::time_t when = std::chrono::system_clock::to_time_t(
            std::chrono::time_point_cast<std::chrono::system_clock::duration>(modified));
        std::tm t{};
        localtime_r(&when, &t);
        char stamp[32];
        std::strftime(stamp, sizeof stamp, "%m/%d/%Y  %I:%M %p", &t);
        auto size = std::filesystem::file_size(local);
        std::string sizeText = std::to_string(size);
        listing << stamp << std::string(sizeText.size() < 18 ? 18 - sizeText.size() : 1, ' ')
                << sizeText << ' ' << nameOf(windowsPath) << "\r\n"
                << "               1 File(s)"
                << std::string(15 - std::min<std::size_t>(14, sizeText.size()), ' ') << sizeText
                << " bytes\r\n"
                << "               0 Dir(s)  107374182400 bytes free\r\n";
    } else {
        listing << "File Not Found\r\n";
        status = 1;
    }
    if (output.empty()) {
        return status;
    }
    std::ofstream out(m_paths.toLocal(output), std::ios::binary | std::ios::trunc);
    out << listing.str();
    return status;
}

int SimProcessRunner::deleteFile(const std::string& windowsPath) {
    std::error_code ec;
    return std::filesystem::remove(m_paths.toLocal(windowsPath), ec) ? 0 : 1;
}

}  // namespace sim
