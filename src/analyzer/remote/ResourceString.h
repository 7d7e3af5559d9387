#pragma once

// VISA resource strings of LAN instruments: TCPIP[n]::HOST[::PORT]::SOCKET (raw socket, port
// 5025 unless given) and TCPIP[n]::HOST[::DEVICE]::INSTR (VXI-11, device inst0 unless
// given). HOST is a name, an IPv4 address, or an IPv6 address in brackets ([::1]).

#include <cstdint>
#include <string>
#include <string_view>

namespace remote {

struct ResourceString {
    enum class Kind { Socket, Vxi11 };
    Kind kind = Kind::Socket;
    std::string host;  // without brackets
    std::uint16_t port = 5025;
    std::string device = "inst0";
    std::string text;  // as given
};

// The accepted forms, for error texts and help.
extern const char* const acceptedResourceForms;

// True when the text is meant as a LAN resource (starts with TCPIP, any case).
bool isLanResource(std::string_view text);
// Throws an error text quoting the string and showing the accepted forms.
ResourceString parseResourceString(std::string_view text);

}  // namespace remote
