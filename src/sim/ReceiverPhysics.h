#pragma once

// Rapp's AM/AM model of a receiver and its AM/PM, in closed form. All powers in dBm at the
// receiver's input, compression in dB (zero or negative), phase in degrees, frequency in Hz.

#include "sim/Scenario.h"

namespace sim {

// Psat(f) = Psat + slope f + ripple sin(2 pi f / period), f in GHz.
double psatDbm(const ReceiverParameters& receiver, double frequencyHz);
// C(P) = -(10/s) log10(1 + 10^(s (P - Psat(f)) / 10)).
double compressionDb(const ReceiverParameters& receiver, double inputDbm, double frequencyHz);
// The input power at which the receiver has compressed by x dB (x > 0):
// Psat(f) + (10/s) log10(10^(s x / 10) - 1).
double compressionInputPowerDbm(const ReceiverParameters& receiver, double xDb, double frequencyHz);
// k C(P): the phase that compression adds to a ratio reading.
double compressionPhaseDeg(const ReceiverParameters& receiver, double inputDbm, double frequencyHz);

}  // namespace sim
