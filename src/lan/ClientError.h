#pragma once

// Why a client's exchange with an instrument failed, in the operator's words ("no reply in
// 10 s", "connection refused"); the caller adds the resource and what it was doing.

#include <chrono>
#include <stdexcept>
#include <string>

namespace lan {

class ClientError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

// "10 s", "2.5 s".
inline std::string secondsText(std::chrono::milliseconds duration) {
    const auto ms = duration.count();
    std::string text = std::to_string(ms / 1000);
    if (ms % 1000 != 0) {
        text += "." + std::to_string(ms % 1000 / 100);
    }
    return text + " s";
}

}  // namespace lan
