#pragma once

#include <string>

#include "scpi/ProgramMessage.h"

namespace scpitest {

// "code: message" of the scpi::Error that action throws, or "no error".
template <typename Action>
std::string scpiErrorOf(Action&& action) {
    try {
        action();
    } catch (const scpi::Error& error) {
        return std::to_string(error.code) + ": " + error.message;
    }
    return "no error";
}

}  // namespace scpitest
