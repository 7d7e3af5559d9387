#pragma once

// What a served instrument offers a transport. A transport frames bytes into program
// messages and hands each whole message to the client's session; it knows nothing of the
// instrument behind it.

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace scpi {

// One client's conversation: its own compound-header path and pending response. Calls on
// sessions of one device may come from several threads; the device serializes them.
class Session {
  public:
    virtual ~Session() = default;
    // Runs one whole program message (terminator removed). Returns the response message
    // without terminator, empty when the message held no query. May block while the
    // instrument finishes an operation (*OPC?, *WAI).
    virtual std::string execute(std::string_view message) = 0;
    // The IEEE 488.2 status byte; `messageAvailable` is the transport's own MAV bit.
    virtual std::uint8_t statusByte(bool messageAvailable) = 0;
    // Queues an error the transport detected, e.g. -410 when a new query arrives before
    // the last response was read, or -161 for a block it could not take.
    virtual void reportError(int code, std::string_view message) = 0;
    // Device clear: forgets the compound-header path and any half-done input.
    virtual void clear() = 0;
};

class Device {
  public:
    virtual ~Device() = default;
    virtual std::unique_ptr<Session> openSession() = 0;
};

}  // namespace scpi
