#pragma once

// The fields of a calibration's port text "Port n,<ratio>,<destination>[,<sweep parameter>]".

#include <string>

namespace engine {

struct PortFields {
    std::string port;            // the character before the first comma, e.g. "1"
    std::string ratioParameter;  // between the first and second comma
    std::string destination;     // after the second comma, up to a third one
    std::string sweepParameter;  // after the third comma; empty without one
};

// Raises an error text naming the receiver and the text when it has no comma.
PortFields parsePortText(const std::string& receiver, const std::string& portText);

}  // namespace engine
