#pragma once

// What the LAN back end needs from a link to an instrument: whole program messages out, one
// response message in, and a way to drop whatever the instrument may still send. A raw
// socket, VXI-11 and the tests' in-memory link carry it.

#include <chrono>
#include <stdexcept>
#include <string>
#include <string_view>

namespace remote {

// Why an exchange failed, in the operator's words ("no reply in 10 s"); the link adds the
// resource and what was being done.
class LinkFailure : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

class Transport {
  public:
    virtual ~Transport() = default;
    // The VISA resource string the link reaches, for messages.
    virtual std::string resource() const = 0;
    // Makes the link usable: connects when it is not connected and, after a failure or an
    // abandoned reply, recovers (a new connection, or a device clear) so that no late reply
    // answers a later query. Throws LinkFailure.
    virtual void open() = 0;
    // Sends one program message, without terminator, on an open link. Throws LinkFailure.
    virtual void send(std::string_view message) = 0;
    // One response message without terminator, within the timeout. Throws LinkFailure, after
    // which the link needs open() again.
    virtual std::string read(std::chrono::milliseconds timeout) = 0;
    // The reply to the last message is no longer wanted: the next open() recovers.
    virtual void abandonReply() = 0;
    // How many connections the link has made; the instrument's per-connection settings must
    // be made again on each.
    virtual unsigned connections() const = 0;
};

}  // namespace remote
