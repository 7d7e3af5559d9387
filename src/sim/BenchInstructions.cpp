#include "sim/BenchInstructions.h"
#include "platform/UpperCase.h"

#include <regex>

namespace sim {
namespace {

const auto icase = std::regex::icase;

std::optional<std::string> receiverInput(const std::string& line) {
    static const std::regex input(R"(RCVR\s+([A-D]|R[1-4])\s+IN)", icase);
    std::smatch match;
    if (!std::regex_search(line, match, input)) {
        return std::nullopt;
    }
    return platform::upperCased(match[1]);
}

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::size_t start = 0;
    while (start <= text.size()) {
        std::size_t end = text.find_first_of("\r\n", start);
        if (end == std::string::npos) {
            end = text.size();
        }
        if (end > start) {
            lines.push_back(text.substr(start, end - start));
        }
        start = end + 1;
    }
    return lines;
}

}  // namespace

std::vector<Instrument::Cable> readConnectionInstructions(const std::string& text) {
    static const std::regex portLine(R"(Connect cable (?:to|from) PORT (\d+))", icase);
    static const std::regex starredPad(R"(\*\*\s*(\d+(?:\.\d+)?)\s*\*\*\s*pad)", icase);
    static const std::regex cablePad(R"(Connect (\d+(?:\.\d+)?)\s*dB pad to cable)", icase);
    static const std::regex referencePad(
        R"(Connect (\d+(?:\.\d+)?) dB pad between \"?RCVR\s+(R[1-4])\s+IN\"? and \"?SRC OUT)",
        icase);
    static const std::regex destination(
        R"(^(Connect pad to|Connect other end of cable to|Connect other port of Delay Line directly to|Connect cable from PORT \d+ to))",
        icase);

    int port = 0;
    double pad = 0.0;
    std::vector<Instrument::Cable> cables;
    std::optional<std::string> target;
    std::smatch match;
    for (const auto& line : linesOf(text)) {
        if (std::regex_search(line, match, portLine)) {
            port = std::stoi(match[1]);
        }
        if (std::regex_search(line, match, starredPad) ||
            std::regex_search(line, match, cablePad)) {
            pad = std::stod(match[1]);
        }
        if (line.find("Lossy Delay Line") != std::string::npos) {
            pad = delayLineLossDb;
        }
        if (std::regex_search(line, match, referencePad)) {
            cables.push_back({match[2].str(), 0, std::stod(match[1])});
        }
        if (std::regex_search(line, destination)) {
            if (auto receiver = receiverInput(line)) {
                target = receiver;
            }
        }
    }
    if (!target) {
        return {};
    }
    for (auto& cable : cables) {
        cable.port = port;  // "SRC OUT" carries the same source as the cable's port
    }
    cables.push_back({*target, port, pad});
    return cables;
}

std::optional<std::string> receiverOfConnectionComplaint(const std::string& text) {
    static const std::regex complaint(R"(Receiver (\S+) In does not seem to be connected)");
    std::smatch match;
    if (!std::regex_search(text, match, complaint)) {
        return std::nullopt;
    }
    return instrumentReceiver(match[1]);
}

std::string instrumentReceiver(const std::string& name) {
    if (name.size() >= 2 && name[0] == 'R' && std::isdigit(static_cast<unsigned char>(name[1]))) {
        return name.substr(0, 2);
    }
    return name.substr(0, 1);
}

}  // namespace sim
