// The SCPI command channel and the error-queue check.

#include <chrono>

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/NumberText.h"

namespace {

constexpr std::chrono::milliseconds commandPause{50};
// An analyzer that keeps answering errors must not hold the caller forever.
constexpr int maxErrorEntries = 1000;
// Flash writes are hundreds of kilobytes; error texts quote only their start.
constexpr std::size_t quotedCommandLength = 80;

std::string quoted(const std::string& command) {
    if (command.size() <= quotedCommandLength) {
        return "\"" + command + "\"";
    }
    return "\"" + command.substr(0, quotedCommandLength) + "...\"";
}

}  // namespace

std::string CNetworkAnalyzer::sendscpi(std::string command) {
    if (!m_pParser) {
        application();  // an absent application is the deeper fault
        throw std::string("could not create TVA SCPI Parser: the analyzer cannot be sent " +
                          quoted(command));
    }
    std::string reply;
    try {
        reply = m_pParser->parse(command);
    } catch (...) {
        m_clock.wait(commandPause);
        throw;
    }
    m_clock.wait(commandPause);
    return reply;
}

int CNetworkAnalyzer::checkerrors(std::string& errors) {
    errors.clear();
    int result = 0;
    for (int entry = 0; entry < maxErrorEntries; ++entry) {
        const std::string reply = sendscpi("SYST:ERR?");
        const auto comma = reply.find(',');
        if (comma == std::string::npos) {
            throw std::string("CNetworkAnalyzer::checkerrors cannot read the SYST:ERR? reply \"" +
                              reply + "\" (code, comma, message expected)");
        }
        const int code = platform::leadingInteger(reply.substr(0, comma));
        if (code == 0) {
            return result;
        }
        result = code;
        if (!errors.empty()) {
            errors += "\n";
        }
        errors.append(reply, comma);
    }
    throw std::string("CNetworkAnalyzer::checkerrors gave up after " +
                      std::to_string(maxErrorEntries) +
                      " entries of the analyzer's error queue; the last ones were:\n" +
                      errors.substr(errors.size() > 500 ? errors.size() - 500 : 0));
}
