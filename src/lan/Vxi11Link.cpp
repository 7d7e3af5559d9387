#include "lan/Vxi11Link.h"

#include <algorithm>

#include "lan/Vxi11.h"

namespace lan {

namespace {

constexpr std::size_t maxQueuedBytes = 1u << 20;

}  // namespace

Vxi11Link::Vxi11Link(std::uint32_t id, std::uint64_t owner, std::shared_ptr<scpi::Session> session,
                     std::size_t maxMessageBytes)
    : m_id(id), m_owner(owner), m_session(std::move(session)), m_framer(maxMessageBytes) {}

bool Vxi11Link::hasRoom() const {
    return m_workBytes < maxQueuedBytes;
}

void Vxi11Link::write(std::string_view data, bool end) {
    m_framer.feed(data);
    for (;;) {
        try {
            auto message = m_framer.next();
            if (!message) {
                break;
            }
            m_workBytes += message->size();
            m_work.push_back({Work::Kind::Message, std::move(*message), 0});
        } catch (const scpi::Error& error) {
            m_work.push_back({Work::Kind::Error, error.message, error.code});
        }
    }
    if (!end) {
        return;
    }
    if (m_framer.pendingIsCompleteText()) {
        auto message = m_framer.takePending();
        m_workBytes += message->size();
        m_work.push_back({Work::Kind::Message, std::move(*message), 0});
        return;
    }
    // END inside a string or block cuts the message off: it never runs. Data that ends in
    // white space left nothing open worth reporting.
    const bool cutOff =
        !data.empty() && std::string_view(" \t\r\n").find(data.back()) == std::string_view::npos;
    m_framer.reset();
    if (cutOff) {
        m_work.push_back({Work::Kind::Error,
                          "Block data error; END came before the block or string was complete",
                          -160});
    }
}

std::optional<Vxi11Link::Work> Vxi11Link::startWork(bool& interrupted) {
    interrupted = false;
    if (m_running || m_work.empty()) {
        return std::nullopt;
    }
    Work work = std::move(m_work.front());
    m_work.pop_front();
    if (work.kind == Work::Kind::Message) {
        m_workBytes -= work.text.size();
        interrupted = hasOutput();
        std::string().swap(m_output);
        m_outputOffset = 0;
    }
    m_running = true;
    return work;
}

void Vxi11Link::workDone(std::uint64_t generation, std::string response) {
    if (generation != m_generation) {
        return;
    }
    m_running = false;
    if (!response.empty()) {
        m_output = std::move(response);
        m_output += '\n';
        m_outputOffset = 0;
    }
}

Vxi11Link::Piece Vxi11Link::read(std::uint32_t requestSize, std::optional<char> termChar) {
    const std::size_t left = m_output.size() - m_outputOffset;
    std::size_t size = std::min<std::size_t>(requestSize, left);
    std::uint32_t reason = vxi11::reasonRequestCount;
    if (termChar) {
        const std::string_view window(m_output.data() + m_outputOffset, size);
        if (const auto at = window.find(*termChar); at != std::string_view::npos) {
            size = at + 1;
            reason = vxi11::reasonTermChar;
        }
    }
    if (size == left) {
        reason |= vxi11::reasonEnd;
        reason &= ~vxi11::reasonRequestCount;
    }
    // A fully read response stays until the next message replaces it: the view points into it.
    const std::string_view piece(m_output.data() + m_outputOffset, size);
    m_outputOffset += size;
    return {piece, reason};
}

void Vxi11Link::clear() {
    ++m_generation;
    m_running = false;
    m_framer.reset();
    m_work.clear();
    m_workBytes = 0;
    std::string().swap(m_output);
    m_outputOffset = 0;
}

}  // namespace lan
