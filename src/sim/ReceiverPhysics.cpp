#include "sim/ReceiverPhysics.h"

#include <cmath>
#include <numbers>

namespace sim {

double psatDbm(const ReceiverParameters& receiver, double frequencyHz) {
    const double ghz = frequencyHz / 1e9;
    double psat = receiver.psatDbm + receiver.psatSlopeDbPerGhz * ghz;
    // A flat receiver's period may be anything, even 0.
    if (receiver.psatRippleDb != 0.0) {
        psat += receiver.psatRippleDb *
                std::sin(2.0 * std::numbers::pi * ghz / receiver.psatRipplePeriodGhz);
    }
    return psat;
}

double compressionDb(const ReceiverParameters& receiver, double inputDbm, double frequencyHz) {
    const double s = receiver.smoothness;
    const double psat = psatDbm(receiver, frequencyHz);
    // log1p keeps the tiny compression of a linear receiver exact.
    return -(10.0 / s) * std::log1p(std::pow(10.0, s * (inputDbm - psat) / 10.0)) / std::log(10.0);
}

double compressionInputPowerDbm(const ReceiverParameters& receiver, double xDb,
                                double frequencyHz) {
    const double s = receiver.smoothness;
    return psatDbm(receiver, frequencyHz) +
           (10.0 / s) * std::log10(std::expm1(s * xDb / 10.0 * std::log(10.0)));
}

double compressionPhaseDeg(const ReceiverParameters& receiver, double inputDbm,
                           double frequencyHz) {
    return receiver.amPmDegPerDb * compressionDb(receiver, inputDbm, frequencyHz);
}

}  // namespace sim
