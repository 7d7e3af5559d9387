#pragma once

// Whether a program message asks for a reply.

#include <string_view>

namespace remote {

// True when a unit's header holds "?", outside quoted strings and blocks: the instrument
// answers such a message with exactly one response.
bool holdsQuery(std::string_view message);

}  // namespace remote
