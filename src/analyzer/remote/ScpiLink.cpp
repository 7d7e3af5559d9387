#include "analyzer/remote/ScpiLink.h"

#include <algorithm>
#include <charconv>

#include "scpi/NumberFormat.h"
#include "scpi/ProgramMessage.h"

namespace remote {
namespace {

// A preset returns the analyzer to ASCII, and nothing else tells the client; both settings
// travel with every data query, and at every new connection for queries sent as they are.
constexpr std::string_view dataSettings = ":FORM:BORD NORM;:FORM:DATA REAL,32";

}  // namespace

ScpiLink::ScpiLink(std::unique_ptr<Transport> transport, std::chrono::milliseconds replyTimeout)
    : m_transport(std::move(transport)),
      m_resource(m_transport->resource()),
      m_replyTimeout(replyTimeout) {
    try {
        m_transport->open();
    } catch (const std::exception& error) {
        throw failure("connecting", "to", error);
    }
}

void ScpiLink::setTraceFile(const std::string& path) {
    m_trace.open(path, std::ios::binary | std::ios::trunc);
    if (!m_trace) {
        throw std::string("Cannot write the trace file " + path);
    }
}

void ScpiLink::trace(char direction, std::string_view text) {
    if (!m_trace.is_open()) {
        return;
    }
    constexpr std::size_t longest = 4000;
    m_trace << direction << ' ' << text.substr(0, longest);
    if (text.size() > longest) {
        m_trace << "... (" << text.size() << " bytes)";
    }
    m_trace << '\n';
    m_trace.flush();
}

std::string ScpiLink::failure(std::string_view doing, std::string_view preposition,
                              const std::exception& reason) const {
    return std::string(doing) + " " + std::string(preposition) + " " + m_resource + ": " +
           reason.what();
}

void ScpiLink::sendMessage(std::string_view message, std::string_view doing,
                           std::string_view preposition) {
    try {
        m_transport->open();
        if (m_settingsMadeOn != m_transport->connections()) {
            m_transport->send(dataSettings);
            trace('>', dataSettings);
            ++m_counts.messages;
            m_settingsMadeOn = m_transport->connections();
        }
        m_transport->send(message);
        trace('>', message);
        ++m_counts.messages;
    } catch (const LinkFailure& error) {
        throw failure(doing, preposition, error);
    }
}

void ScpiLink::command(std::string_view message, std::string_view doing) {
    sendMessage(message, doing, "on");
}

std::string ScpiLink::query(std::string_view message, std::string_view doing) {
    sendMessage(message, doing, "from");
    ++m_counts.roundTrips;
    try {
        std::string reply = m_transport->read(m_replyTimeout);
        trace('<', reply);
        return reply;
    } catch (const LinkFailure& error) {
        trace('!', error.what());
        throw failure(doing, "from", error);
    }
}

double ScpiLink::queryNumber(std::string_view message, std::string_view doing) {
    const std::string reply = query(message, doing);
    std::string_view text = reply;
    text.remove_prefix(std::min(text.find_first_not_of(" +"), text.size()));
    double value = 0.0;
    const auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (ec != std::errc() || end == text.data() ||
        std::string_view(end, text.data() + text.size() - end).find_first_not_of(" \r") !=
            std::string_view::npos) {
        throw std::string(doing) + " from " + m_resource + ": the reply \"" + reply.substr(0, 80) +
            "\" is not a number";
    }
    return value;
}

std::string ScpiLink::queryString(std::string_view message, std::string_view doing) {
    std::string reply = query(message, doing);
    if (reply.size() >= 2 && reply.front() == '"' && reply.back() == '"') {
        return reply.substr(1, reply.size() - 2);
    }
    return reply;
}

std::optional<std::string> ScpiLink::queryWithin(std::string_view message,
                                                 std::chrono::milliseconds limit,
                                                 std::string_view doing) {
    sendMessage(message, doing, "from");
    ++m_counts.roundTrips;
    try {
        std::string reply = m_transport->read(limit);
        trace('<', reply);
        return reply;
    } catch (const LinkFailure&) {
        trace('!', "no reply within the wait's limit");
        // Past the limit the caller goes on as the analyzer's own wait does; a dead link
        // shows at the next message.
        m_transport->abandonReply();
        return std::nullopt;
    }
}

std::vector<float> ScpiLink::queryFloats(std::string_view query, std::string_view doing) {
    m_buffer.assign(dataSettings);
    m_buffer += query.starts_with(':') ? ";" : ";:";
    m_buffer += query;
    const std::string reply = this->query(m_buffer, doing);
    try {
        const std::vector<double> values =
            scpi::decodeValues(reply, scpi::DataFormat::Real32, scpi::ByteOrder::Normal);
        return std::vector<float>(values.begin(), values.end());
    } catch (const scpi::Error& error) {
        throw std::string(doing) + " from " + m_resource + ": the reply is not a REAL,32 block (" +
            error.message + ")";
    }
}

}  // namespace remote
