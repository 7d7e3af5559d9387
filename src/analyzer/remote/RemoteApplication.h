#pragma once

// The analyzer application's automation objects carried out as the analyzer's SCPI over a
// link. Each call keeps the meaning the in-process objects give it; a call the instrument
// refuses leaves its error in the instrument's queue for checkerrors, since the back end
// never reads the queue itself.

#include <memory>

#include "analyzer/automation/Automation.h"
#include "analyzer/remote/ScpiLink.h"

namespace remote {

std::shared_ptr<automation::Object> makeApplication(std::shared_ptr<ScpiLink> link);

}  // namespace remote
