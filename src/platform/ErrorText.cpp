#include "platform/ErrorText.h"

#include <exception>

namespace platform {

std::string currentErrorText() {
    try {
        throw;
    } catch (const std::string& text) {
        return text;
    } catch (const char* text) {
        return text ? text : "";
    } catch (const std::exception& e) {
        return e.what();
    } catch (...) {
        return "Unknown error";
    }
}

}  // namespace platform
