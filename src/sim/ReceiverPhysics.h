#pragma once

// Rapp's AM/AM model of a receiver and its AM/PM, in closed form. All powers in dBm at the
// receiver's input, compression in dB (zero or negative), phase in degrees.

#include "sim/Scenario.h"

namespace sim {

// C(P) = -(10/s) log10(1 + 10^(s (P - Psat) / 10)).
double compressionDb(const ReceiverParameters& receiver, double inputDbm);
// The input power at which the receiver has compressed by x dB (x > 0):
// Psat + (10/s) log10(10^(s x / 10) - 1).
double compressionInputPowerDbm(const ReceiverParameters& receiver, double xDb);
// k C(P): the phase that compression adds to a ratio reading.
double compressionPhaseDeg(const ReceiverParameters& receiver, double inputDbm);

}  // namespace sim
