#pragma once

#include <string>

namespace platform {

// Each character as the standard toupper maps it in the "C" locale.
std::string upperCased(std::string text);

}  // namespace platform
