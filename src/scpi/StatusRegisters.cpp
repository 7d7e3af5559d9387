#include "scpi/StatusRegisters.h"

#include <cmath>
#include <string>

#include "scpi/ProgramMessage.h"

namespace scpi {
namespace {

std::uint8_t registerValue(double value, const char* command) {
    double rounded = std::round(value);
    if (!(rounded >= 0.0 && rounded <= 255.0)) {
        throw Error{-222, std::string("Data out of range; ") + command + " takes 0 to 255"};
    }
    return static_cast<std::uint8_t>(rounded);
}

}  // namespace

void StatusRegisters::recordError(int code) {
    if (code == 0) {
        return;
    }
    switch (code < 0 ? -(code / 100) : 0) {
        case 1:
            m_events |= commandErrorBit;
            break;
        case 2:
            m_events |= executionErrorBit;
            break;
        case 4:
            m_events |= queryErrorBit;
            break;
        case 5:
            m_events |= powerOnBit;
            break;
        case 6:
            m_events |= userRequestBit;
            break;
        case 7:
            m_events |= requestControlBit;
            break;
        case 8:
            m_events |= operationCompleteBit;
            break;
        default:
            m_events |= deviceErrorBit;
            break;
    }
}

std::uint8_t StatusRegisters::readEventStatus() {
    std::uint8_t events = m_events;
    m_events = 0;
    return events;
}

std::uint8_t StatusRegisters::statusByte(bool errorQueueNotEmpty, bool messageAvailable) const {
    std::uint8_t status = 0;
    if (errorQueueNotEmpty) {
        status |= errorAvailableBit;
    }
    if (messageAvailable) {
        status |= messageAvailableBit;
    }
    if (m_events & m_eventEnable) {
        status |= eventSummaryBit;
    }
    // MSS summarizes the other bits: enabling bit 6 itself requests nothing.
    if (status & m_serviceEnable) {
        status |= serviceRequestBit;
    }
    return status;
}

void StatusRegisters::setEventStatusEnable(double value) {
    m_eventEnable = registerValue(value, "*ESE");
}

void StatusRegisters::setServiceRequestEnable(double value) {
    m_serviceEnable = registerValue(value, "*SRE");
}

}  // namespace scpi
