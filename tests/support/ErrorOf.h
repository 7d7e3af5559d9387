#pragma once

#include <functional>
#include <string>

namespace testsupport {

// The error text that action raises (either kind of text), or "nothing thrown".
std::string errorOf(const std::function<void()>& action);

}  // namespace testsupport
