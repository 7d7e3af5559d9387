#pragma once

// VXI-11 numbers both ends of a link share: programs, procedures, flags, read reasons and
// error codes.

#include <cstdint>

namespace lan::vxi11 {

constexpr std::uint32_t coreProgram = 0x0607AF;
constexpr std::uint32_t abortProgram = 0x0607B0;
constexpr std::uint32_t version = 1;

enum Procedure : std::uint32_t {
    createLink = 10,
    deviceWrite = 11,
    deviceRead = 12,
    deviceReadStb = 13,
    deviceTrigger = 14,
    deviceClear = 15,
    deviceRemote = 16,
    deviceLocal = 17,
    deviceLock = 18,
    deviceUnlock = 19,
    deviceEnableSrq = 20,
    deviceDocmd = 22,
    destroyLink = 23,
    createInterruptChannel = 25,
    destroyInterruptChannel = 26,
    deviceAbort = 1,
};

constexpr std::uint32_t flagWaitLock = 1;
constexpr std::uint32_t flagEnd = 8;
constexpr std::uint32_t flagTermCharSet = 128;

constexpr std::uint32_t reasonRequestCount = 1;
constexpr std::uint32_t reasonTermChar = 2;
constexpr std::uint32_t reasonEnd = 4;

enum Error : std::uint32_t {
    noError = 0,
    deviceNotAccessible = 3,
    invalidLink = 4,
    operationNotSupported = 8,
    outOfResources = 9,
    deviceLocked = 11,
    noLockHeld = 12,
    ioTimeout = 15,
    ioError = 17,
    invalidAddress = 21,
    aborted = 23,
};

}  // namespace lan::vxi11
