#pragma once

// What the operator's hands do at the simulated bench: on the in-process instrument, or, for
// a served simulator, as the simulator-only bench commands sent over the link.

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "sim/Instrument.h"

namespace sim {

class BenchHands {
  public:
    virtual ~BenchHands() = default;
    // These receivers are cabled; every other one goes back to its front-panel jumper.
    virtual void cable(const std::vector<Instrument::Cable>& cables) = 0;
    virtual void recheckConnection(const std::string& receiver) = 0;
    virtual void recheckPad(const std::string& receiver) = 0;
    virtual void reseatConnector(const std::string& receiver) = 0;
};

// The hands on an instrument in this process.
std::unique_ptr<BenchHands> handsOn(Instrument& instrument);
// The hands of a served simulator's client: each action is one SIMulate:BENCH command
// handed to `send`.
std::unique_ptr<BenchHands> handsOverLink(std::function<void(const std::string&)> send);

}  // namespace sim
