#pragma once

// The simulated instrument as a transport serves it: every session reaches the one
// instrument state, its error queue and status registers, as clients of a real analyzer do.

#include <memory>

#include "scpi/Device.h"

namespace sim {

class Instrument;

std::unique_ptr<scpi::Device> makeScpiDevice(std::shared_ptr<Instrument> instrument);

}  // namespace sim
