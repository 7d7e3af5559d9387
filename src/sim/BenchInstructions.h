#pragma once

// Reads the operator's connection instructions the way a service engineer does: which
// source port the cable leaves, which pad or delay line goes in line, and which receiver
// input ("RCVR x IN") it ends at, plus the reference-receiver pad from "SRC OUT".

#include <optional>
#include <string>
#include <vector>

#include "sim/Instrument.h"

namespace sim {

// The lossy delay line's loss, dB.
constexpr double delayLineLossDb = 21.0;

// The cables one instruction text asks for; empty when it names no receiver input.
std::vector<Instrument::Cable> readConnectionInstructions(const std::string& text);

// The receiver named by a "Check Connection" box ("Receiver X In does not seem ...").
std::optional<std::string> receiverOfConnectionComplaint(const std::string& text);

// The instrument receiver behind a receiver name of the tool: "R1 LOW FREQUENCY EXTENSION"
// and "R1_LFE" are R1.
std::string instrumentReceiver(const std::string& name);

}  // namespace sim
