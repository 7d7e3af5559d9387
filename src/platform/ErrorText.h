#pragma once

// Errors travel as exceptions that carry only their text: mostly std::string, three as
// plain character strings. Every handler turns whatever it caught into one text here.

#include <string>

namespace platform {

// Call only inside a catch block. Returns the text of the exception being handled;
// exceptions that are neither texts nor std::exception get a generic description.
std::string currentErrorText();

}  // namespace platform
