#pragma once

// One VXI-11 link's side of the conversation: its session, the program messages framed from
// its writes and waiting to run, and the response waiting to be read. Lives on the server's
// state strand; only `session` is used on the execution thread.

#include <cstdint>
#include <deque>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "scpi/Device.h"
#include "scpi/MessageFramer.h"

namespace lan {

class Vxi11Link {
  public:
    // What runs next on the execution thread: a message, a transport error to queue, or
    // a group execute trigger.
    struct Work {
        enum class Kind { Message, Error, Trigger };
        Kind kind = Kind::Message;
        std::string text;
        int errorCode = 0;
    };

    struct Piece {
        std::string_view bytes;
        std::uint32_t reason;
    };

    Vxi11Link(std::uint32_t id, std::uint64_t owner, std::shared_ptr<scpi::Session> session,
              std::size_t maxMessageBytes);

    std::uint32_t id() const { return m_id; }
    std::uint64_t owner() const { return m_owner; }
    const std::shared_ptr<scpi::Session>& session() const { return m_session; }

    // Whether another write may be taken now; a link whose messages pile up waits.
    bool hasRoom() const;
    // Frames written bytes; `end` (the END flag) closes a message that lacks its NL.
    void write(std::string_view data, bool end);
    void trigger() { m_work.push_back({Work::Kind::Trigger, "", 0}); }

    // The next work to run, if none is running. A new message while a response is unread
    // discards that response: `interrupted` tells the caller to queue -410.
    std::optional<Work> startWork(bool& interrupted);
    // The work started last has finished, producing `response` (possibly empty). Ignored
    // when the link was cleared since it started.
    void workDone(std::uint64_t generation, std::string response);
    std::uint64_t generation() const { return m_generation; }

    bool hasOutput() const { return m_outputOffset < m_output.size(); }
    // Up to `requestSize` bytes of the response, ending after `termChar` when it is set.
    // The view stays valid until the next call on the link.
    Piece read(std::uint32_t requestSize, std::optional<char> termChar);

    // Device clear: pending input, queued work and unread output are dropped; a message that
    // is running finishes but its response is not kept.
    void clear();

  private:
    std::uint32_t m_id;
    std::uint64_t m_owner;
    std::shared_ptr<scpi::Session> m_session;
    scpi::MessageFramer m_framer;
    std::deque<Work> m_work;
    std::size_t m_workBytes = 0;
    bool m_running = false;
    std::uint64_t m_generation = 0;
    std::string m_output;
    std::size_t m_outputOffset = 0;
};

}  // namespace lan
