#pragma once

// IEEE 488.2 status reporting: the Standard Event Status Register with its enable (*ESR?,
// *ESE), and the status byte with the service request enable (*STB?, *SRE). The error
// queue and the output queue belong to others; statusByte() is told whether they hold
// anything.

#include <cstdint>

namespace scpi {

class StatusRegisters {
  public:
    // Standard Event Status Register bits.
    static constexpr std::uint8_t operationCompleteBit = 0x01;  // OPC
    static constexpr std::uint8_t requestControlBit = 0x02;     // RQC
    static constexpr std::uint8_t queryErrorBit = 0x04;         // QYE
    static constexpr std::uint8_t deviceErrorBit = 0x08;        // DDE
    static constexpr std::uint8_t executionErrorBit = 0x10;     // EXE
    static constexpr std::uint8_t commandErrorBit = 0x20;       // CME
    static constexpr std::uint8_t userRequestBit = 0x40;        // URQ
    static constexpr std::uint8_t powerOnBit = 0x80;            // PON

    // Status byte bits.
    static constexpr std::uint8_t errorAvailableBit = 0x04;    // EAV
    static constexpr std::uint8_t messageAvailableBit = 0x10;  // MAV
    static constexpr std::uint8_t eventSummaryBit = 0x20;      // ESB
    static constexpr std::uint8_t serviceRequestBit = 0x40;    // MSS

    // Powers on: PON set, enables zero.
    StatusRegisters() = default;

    // Sets the event bit of the error's class: -1xx CME, -2xx EXE, -3xx and device-specific
    // (positive) DDE, -4xx QYE; the event codes -5xx to -8xx set PON, URQ, RQC and OPC.
    void recordError(int code);
    void operationComplete() { m_events |= operationCompleteBit; }
    // *ESR?: the register, which reading clears.
    std::uint8_t readEventStatus();
    std::uint8_t statusByte(bool errorQueueNotEmpty, bool messageAvailable) const;

    // *ESE and *SRE take any number that rounds to 0..255; Error -222 otherwise.
    void setEventStatusEnable(double value);
    std::uint8_t eventStatusEnable() const { return m_eventEnable; }
    void setServiceRequestEnable(double value);
    std::uint8_t serviceRequestEnable() const { return m_serviceEnable; }

    // *CLS: clears the events, keeps the enables.
    void clear() { m_events = 0; }

  private:
    std::uint8_t m_events = powerOnBit;
    std::uint8_t m_eventEnable = 0;
    std::uint8_t m_serviceEnable = 0;
};

}  // namespace scpi
