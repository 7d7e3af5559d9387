#pragma once

// The automation objects the simulated application hands out. Each holds the instrument
// and the application generation it belongs to; after a restart of the application every
// call through an older object raises an error text.

#include <memory>

#include "analyzer/automation/Automation.h"
#include "sim/Instrument.h"

namespace sim {

std::shared_ptr<automation::Object> makeApplicationObject(std::shared_ptr<Instrument> instrument);

}  // namespace sim
