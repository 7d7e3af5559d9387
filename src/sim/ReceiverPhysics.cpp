#include "sim/ReceiverPhysics.h"

#include <cmath>

namespace sim {

double compressionDb(const ReceiverParameters& receiver, double inputDbm) {
    const double s = receiver.smoothness;
    // log1p keeps the tiny compression of a linear receiver exact.
    return -(10.0 / s) * std::log1p(std::pow(10.0, s * (inputDbm - receiver.psatDbm) / 10.0)) /
           std::log(10.0);
}

double compressionInputPowerDbm(const ReceiverParameters& receiver, double xDb) {
    const double s = receiver.smoothness;
    return receiver.psatDbm + (10.0 / s) * std::log10(std::expm1(s * xDb / 10.0 * std::log(10.0)));
}

double compressionPhaseDeg(const ReceiverParameters& receiver, double inputDbm) {
    return receiver.amPmDegPerDb * compressionDb(receiver, inputDbm);
}

}  // namespace sim
