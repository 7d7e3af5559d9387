#include "analyzer/remote/ResourceString.h"

#include <algorithm>
#include <charconv>
#include <vector>

#include "platform/UpperCase.h"

namespace remote {

const char* const acceptedResourceForms =
    "TCPIP[n]::HOST[::PORT]::SOCKET (raw socket, PORT 5025 unless given) or "
    "TCPIP[n]::HOST[::DEVICE]::INSTR (VXI-11, DEVICE inst0 unless given); HOST is a name, an "
    "IPv4 address or an IPv6 address in brackets, e.g. TCPIP::127.0.0.1::5025::SOCKET, "
    "TCPIP0::[::1]::inst0::INSTR";

namespace {

// The fields between "::", keeping a bracketed IPv6 address whole.
std::vector<std::string> fields(std::string_view text) {
    std::vector<std::string> parts;
    std::string current;
    bool inBrackets = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (c == '[') {
            inBrackets = true;
        } else if (c == ']') {
            inBrackets = false;
        }
        if (!inBrackets && c == ':' && i + 1 < text.size() && text[i + 1] == ':') {
            parts.push_back(current);
            current.clear();
            ++i;
            continue;
        }
        current += c;
    }
    parts.push_back(current);
    return parts;
}

bool validHost(const std::string& host) {
    if (host.empty()) {
        return false;
    }
    if (host.front() == '[') {
        // An IPv6 address, with a zone after "%" (::1%lo).
        return host.size() > 2 && host.back() == ']' &&
               std::all_of(host.begin() + 1, host.end() - 1, [](char c) {
                   return std::isalnum(static_cast<unsigned char>(c)) || c == ':' || c == '.' ||
                          c == '%';
               });
    }
    return std::all_of(host.begin(), host.end(), [](char c) {
        return std::isalnum(static_cast<unsigned char>(c)) || c == '.' || c == '-' || c == '_';
    });
}

}  // namespace

bool isLanResource(std::string_view text) {
    return platform::upperCased(std::string(text.substr(0, 5))) == "TCPIP";
}

ResourceString parseResourceString(std::string_view text) {
    auto refuse = [&](const std::string& why) {
        return "The analyzer \"" + std::string(text) + "\" cannot be reached: " + why +
               ". Accepted: " + acceptedResourceForms;
    };
    const std::vector<std::string> parts = fields(text);
    const std::string interface = platform::upperCased(parts.front());
    if (interface.rfind("TCPIP", 0) != 0 ||
        interface.find_first_not_of("0123456789", 5) != std::string::npos) {
        throw refuse("it does not start with TCPIP or TCPIPn");
    }
    if (parts.size() < 3 || parts.size() > 4) {
        throw refuse("it has " + std::to_string(parts.size()) + " fields separated by ::");
    }
    ResourceString resource;
    resource.text = std::string(text);
    resource.host = parts[1];
    if (!validHost(resource.host)) {
        throw refuse("\"" + resource.host + "\" is not a host name or address");
    }
    if (resource.host.front() == '[') {
        resource.host = resource.host.substr(1, resource.host.size() - 2);
    }
    const std::string kind = platform::upperCased(parts.back());
    if (kind == "SOCKET") {
        resource.kind = ResourceString::Kind::Socket;
        if (parts.size() == 4) {
            unsigned port = 0;
            const auto& p = parts[2];
            const auto [end, ec] = std::from_chars(p.data(), p.data() + p.size(), port);
            if (ec != std::errc() || end != p.data() + p.size() || port == 0 || port > 65535) {
                throw refuse("\"" + p + "\" is not a port number from 1 to 65535");
            }
            resource.port = static_cast<std::uint16_t>(port);
        }
    } else if (kind == "INSTR") {
        resource.kind = ResourceString::Kind::Vxi11;
        if (parts.size() == 4) {
            if (parts[2].empty()) {
                throw refuse("the device name is empty");
            }
            resource.device = parts[2];
        }
    } else {
        throw refuse("it ends in \"" + parts.back() + "\", not SOCKET or INSTR");
    }
    return resource;
}

}  // namespace remote
