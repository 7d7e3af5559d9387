#include "ErrorOf.h"

#include "platform/ErrorText.h"

namespace testsupport {

std::string errorOf(const std::function<void()>& action) {
    try {
        action();
    } catch (...) {
        return platform::currentErrorText();
    }
    return "nothing thrown";
}

}  // namespace testsupport
