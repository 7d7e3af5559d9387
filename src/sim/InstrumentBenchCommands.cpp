// Simulator-only commands: a client's simulated bench tells a served instrument what the
// operator did, since the operator's hands are on the client's side of the network. A real
// analyzer answers them with -113, which is how a client tells the two apart.

#include "sim/CommandText.h"
#include "sim/Instrument.h"

namespace sim {

void Instrument::addBenchCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;
    // As at the in-process bench, a receiver the instrument does not have is left alone.
    auto receiverOf = [](C& c) { return c.parameters.string(); };

    t.add("SIMulate:VERSion?", [](C&) { return std::string("1"); });
    // Receiver, source port and pad (dB) per cable; receivers not named get their jumper.
    t.add("SIMulate:BENCH:CABLe", [this, receiverOf](C& c) {
        std::vector<Cable> cables;
        while (!c.parameters.atEnd()) {
            Cable cable;
            cable.receiver = receiverOf(c);
            cable.port = integerIn(c.parameters.number(), 0, 64);
            cable.padDb = c.parameters.number();
            cables.push_back(std::move(cable));
        }
        cableReceiversHeld(cables);
        return std::string();
    });
    t.add("SIMulate:BENCH:RECHeck:CONNection", [this, receiverOf](C& c) {
        operatorRecheckedConnectionHeld(receiverOf(c));
        return std::string();
    });
    t.add("SIMulate:BENCH:RECHeck:PAD", [this, receiverOf](C& c) {
        operatorRecheckedPadHeld(receiverOf(c));
        return std::string();
    });
    t.add("SIMulate:BENCH:RESeat", [this, receiverOf](C& c) {
        operatorSawBadDataHeld(receiverOf(c));
        return std::string();
    });
}

}  // namespace sim
