#pragma once

// The exchange of program messages with one instrument over a Transport: commands, queries
// with the reply timeout, and trace data as REAL,32 blocks. Every failure becomes one error
// text naming what was being done and where, e.g. "reading the trace of measurement
// 'measratio' from TCPIP::127.0.0.1::5025::SOCKET: no reply in 10 s". Not thread-safe: the
// proxy that owns the back end uses it from one thread at a time.

#include <chrono>
#include <fstream>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "analyzer/remote/Transport.h"

namespace remote {

class ScpiLink {
  public:
    // Opens the transport; a link that cannot be made raises its error text.
    ScpiLink(std::unique_ptr<Transport> transport, std::chrono::milliseconds replyTimeout);

    // Every call raises an error text (std::string) when the link fails.
    void command(std::string_view message, std::string_view doing);
    std::string query(std::string_view message, std::string_view doing);
    // A number reply (NR1, NR2 or NR3), and a string reply without its double quotes.
    double queryNumber(std::string_view message, std::string_view doing);
    std::string queryString(std::string_view message, std::string_view doing);
    // A query whose reply may take up to `limit` (an operation that completes). Returns
    // nothing when the limit passed; the late reply is then dropped with the connection or
    // by a device clear before the next message.
    std::optional<std::string> queryWithin(std::string_view message,
                                           std::chrono::milliseconds limit, std::string_view doing);
    // The REAL,32 block a data query answers, decoded into floats. The data format and
    // byte order are set in the same message, since a preset or a client's own FORM command
    // may have changed them.
    std::vector<float> queryFloats(std::string_view query, std::string_view doing);

    // Writes every later message and reply to the file ("> message", "< reply"), long ones
    // abbreviated. Raises an error text when the file cannot be opened.
    void setTraceFile(const std::string& path);

    const std::string& resource() const { return m_resource; }
    std::chrono::milliseconds replyTimeout() const { return m_replyTimeout; }

    // Traffic so far: messages sent, and replies waited for (round trips).
    struct Counts {
        unsigned long messages = 0;
        unsigned long roundTrips = 0;
    };
    const Counts& counts() const { return m_counts; }

  private:
    void sendMessage(std::string_view message, std::string_view doing,
                     std::string_view preposition);
    // "<doing> <preposition> <resource>: <reason>".
    std::string failure(std::string_view doing, std::string_view preposition,
                        const std::exception& reason) const;

    std::unique_ptr<Transport> m_transport;
    std::string m_resource;
    std::chrono::milliseconds m_replyTimeout;
    unsigned m_settingsMadeOn = 0;
    Counts m_counts;
    void trace(char direction, std::string_view text);

    std::string m_buffer;
    std::ofstream m_trace;
};

}  // namespace remote
