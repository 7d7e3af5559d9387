#include "scpi/MessageFramer.h"

#include <algorithm>

namespace scpi {
namespace {

// The bytes the text scanner stops at; after an error only NL and blocks matter.
struct Stops {
    std::array<bool, 256> text{};
    std::array<bool, 256> discarding{};
    constexpr Stops() {
        for (unsigned char c : {'\n', '#', '"', '\''}) {
            text[c] = true;
        }
        for (unsigned char c : {'\n', '#'}) {
            discarding[c] = true;
        }
    }
};
constexpr Stops stops;

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

}  // namespace

MessageFramer::MessageFramer(std::size_t maxMessageBytes) : m_limit(maxMessageBytes) {}

void MessageFramer::feed(std::string_view bytes) {
    // bytes[segment, i) are scanned but not yet in m_current.
    std::size_t segment = 0;
    std::size_t i = 0;
    while (i < bytes.size()) {
        switch (m_state) {
            case State::Text: {
                const auto& stop = m_discarding ? stops.discarding : stops.text;
                while (i < bytes.size() && !stop[static_cast<unsigned char>(bytes[i])]) {
                    ++i;
                }
                if (i == bytes.size()) {
                    break;
                }
                char c = bytes[i++];
                if (c == '\n') {
                    keep(bytes.substr(segment, i - 1 - segment));
                    segment = i;
                    endMessage();
                } else if (c == '#') {
                    m_state = State::BlockHeader;
                    m_header[0] = c;
                    m_headerSize = 1;
                } else {
                    m_state = State::String;
                    m_quote = c;
                }
                break;
            }
            case State::String: {
                std::size_t quote = bytes.find(m_quote, i);
                if (quote == std::string_view::npos) {
                    i = bytes.size();
                } else {
                    // A doubled quote closes and reopens the string: same framing.
                    i = quote + 1;
                    m_state = State::Text;
                }
                break;
            }
            case State::BlockHeader: {
                char c = bytes[i];
                if (m_headerSize == 1 && !isDigit(c)) {
                    // "#H1F" and the like are numbers; this byte is text again.
                    m_state = State::Text;
                    break;
                }
                m_header[m_headerSize++] = c;
                std::optional<BlockHeader> header;
                try {
                    header = readBlockHeader(std::string_view(m_header.data(), m_headerSize));
                } catch (Error& error) {
                    // The byte that broke the header is scanned again as text: it may be NL.
                    m_state = State::Text;
                    if (!m_discarding) {
                        fail(std::move(error));
                        segment = i;
                    }
                    break;
                }
                ++i;
                if (!header) {
                    break;
                }
                m_state = State::BlockData;
                m_blockRemaining = header->dataBytes;
                std::size_t messageBytes = m_current.size() + (i - segment);
                if (!m_discarding &&
                    header->dataBytes > m_limit - std::min(m_limit, messageBytes)) {
                    // Known from the header alone: no need to wait for the data.
                    fail(Error{-223, "Too much data; a block of " +
                                         std::to_string(header->dataBytes) +
                                         " bytes makes the message longer than " +
                                         std::to_string(m_limit) + " bytes"});
                    segment = i;
                }
                if (m_blockRemaining == 0) {
                    endBlock(messageBytes);
                }
                break;
            }
            case State::BlockData: {
                std::size_t n = std::min(m_blockRemaining, bytes.size() - i);
                i += n;
                m_blockRemaining -= n;
                if (m_blockRemaining == 0) {
                    endBlock(m_current.size() + (i - segment));
                }
                break;
            }
        }
    }
    keep(bytes.substr(segment));
}

void MessageFramer::keep(std::string_view bytes) {
    if (m_discarding) {
        return;
    }
    if (bytes.size() > m_limit - m_current.size()) {
        fail(Error{-223,
                   "Too much data; message longer than " + std::to_string(m_limit) + " bytes"});
        return;
    }
    m_current += bytes;
}

void MessageFramer::fail(Error error) {
    m_ready.emplace_back(std::move(error));
    m_current = std::string();
    m_blockEnd = 0;
    m_discarding = true;
    if (m_state == State::String) {
        m_state = State::Text;
    }
}

void MessageFramer::endBlock(std::size_t messageBytes) {
    m_state = State::Text;
    m_blockEnd = m_discarding ? 0 : messageBytes;
}

void MessageFramer::endMessage() {
    if (m_discarding) {
        m_discarding = false;
    } else {
        if (m_current.size() > m_blockEnd && m_current.back() == '\r') {
            m_current.pop_back();
        }
        m_ready.emplace_back(std::move(m_current));
    }
    m_current = std::string();
    m_blockEnd = 0;
}

std::optional<std::string> MessageFramer::next() {
    if (m_ready.empty()) {
        return std::nullopt;
    }
    auto item = std::move(m_ready.front());
    m_ready.pop_front();
    if (auto* error = std::get_if<Error>(&item)) {
        throw std::move(*error);
    }
    return std::move(std::get<std::string>(item));
}

bool MessageFramer::pendingIsCompleteText() const {
    return !m_discarding && m_ready.empty() && m_state == State::Text &&
           m_current.find_first_not_of(" \t\r\n") != std::string::npos;
}

std::optional<std::string> MessageFramer::takePending() {
    if (!pendingIsCompleteText()) {
        return std::nullopt;
    }
    if (m_current.size() > m_blockEnd && m_current.back() == '\r') {
        m_current.pop_back();
    }
    std::string message = std::move(m_current);
    m_current = std::string();
    m_blockEnd = 0;
    return message;
}

void MessageFramer::reset() {
    m_ready.clear();
    m_current = std::string();
    m_state = State::Text;
    m_discarding = false;
    m_headerSize = 0;
    m_blockRemaining = 0;
    m_blockEnd = 0;
}

}  // namespace scpi
