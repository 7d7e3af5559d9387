#pragma once

#include <stdexcept>

namespace lan {

// Bytes from a peer that break the wire protocol (XDR, record marking, RPC headers). The
// server answers GARBAGE_ARGS where it can, or closes that one connection.
class ProtocolError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

}  // namespace lan
