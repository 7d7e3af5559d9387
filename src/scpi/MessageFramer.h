#pragma once

// Program messages out of a byte stream (a raw socket, VXI-11 writes). A message ends with
// NL outside quoted strings and definite-length blocks; a CR right before that NL is part
// of the terminator. Input is scanned once as it arrives: the scanner keeps its position
// and its string and block state between feeds.

#include <array>
#include <cstddef>
#include <deque>
#include <optional>
#include <string>
#include <string_view>
#include <variant>

#include "scpi/Block.h"
#include "scpi/ProgramMessage.h"

namespace scpi {

class MessageFramer {
  public:
    // The default takes the largest block and a margin of text around it.
    explicit MessageFramer(std::size_t maxMessageBytes = maxBlockBytes + (1u << 20));

    void feed(std::string_view bytes);
    // The next complete message, terminator removed. A message over the limit or with a
    // bad block header throws Error -223 or -161 once in its place; the input after it
    // is dropped up to the next NL outside a block, and the messages after that follow.
    std::optional<std::string> next();

    // Whether the unterminated input is a message complete as text (no string or block
    // open, something besides blanks) with no complete message waiting before it. Some
    // clients send no terminator, so a transport runs such input after an idle gap.
    bool pendingIsCompleteText() const;
    std::optional<std::string> takePending();

    // Drops everything buffered (disconnect, device clear): a message cut off never runs.
    void reset();

  private:
    enum class State { Text, String, BlockHeader, BlockData };

    // Adds scanned bytes to the current message, or drops it with -223 past the limit.
    void keep(std::string_view bytes);
    void fail(Error error);
    void endMessage();
    void endBlock(std::size_t messageBytes);

    std::size_t m_limit;
    std::deque<std::variant<std::string, Error>> m_ready;
    std::string m_current;
    State m_state = State::Text;
    char m_quote = 0;
    // After an error, input is dropped up to the next NL outside a block.
    bool m_discarding = false;
    // The header seen so far; its bytes are kept in m_current too.
    std::array<char, 11> m_header{};
    std::size_t m_headerSize = 0;
    std::size_t m_blockRemaining = 0;
    // Where the current message's last block ends: a CR there is data, not terminator.
    std::size_t m_blockEnd = 0;
};

}  // namespace scpi
