#pragma once

// The cabling the operator was last told to fit. It outlives runs, so that a run that
// continues on the same cabling does not repeat the instructions.

#include <string>

namespace engine {

struct RememberedConnection {
    std::string portText;
    std::string destination;
    int pad = 0;

    // The one the dialog's runs share for the life of the program.
    static RememberedConnection& processWide();
};

}  // namespace engine
