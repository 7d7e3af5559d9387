#include <gtest/gtest.h>

#include "ScpiErrorCode.h"
#include "scpi/ErrorQueue.h"
#include "scpi/StatusRegisters.h"

namespace {

using scpi::StatusRegisters;

TEST(ScpiStatus, ErrorsSetTheirClassBitAndEnabledEventsRequestService) {
    const std::pair<int, int> classes[] = {{-100, 0x20}, {-199, 0x20}, {-222, 0x10}, {-350, 0x08},
                                           {1234, 0x08}, {-410, 0x04}, {-800, 0x01}, {0, 0}};
    for (auto [code, bit] : classes) {
        StatusRegisters status;
        EXPECT_EQ(0x80, status.readEventStatus());  // power on
        status.recordError(code);
        EXPECT_EQ(bit, status.readEventStatus()) << code;
    }

    StatusRegisters status;
    status.clear();
    status.setEventStatusEnable(0x20);
    status.recordError(-222);
    EXPECT_EQ(0x14, status.statusByte(true, true));  // EAV, MAV, no ESB
    status.recordError(-113);
    status.setServiceRequestEnable(0x40);  // MSS cannot enable itself
    EXPECT_EQ(0x20, status.statusByte(false, false));
    status.setServiceRequestEnable(0x20);
    EXPECT_EQ(0x60, status.statusByte(false, false));
    status.setServiceRequestEnable(0x10);
    status.clear();  // *CLS keeps the enables
    EXPECT_EQ(0x50, status.statusByte(false, true));

    status.setEventStatusEnable(254.6);
    EXPECT_EQ(255, status.eventStatusEnable());
    EXPECT_EQ("-222: Data out of range; *SRE takes 0 to 255",
              scpitest::scpiErrorOf([&] { status.setServiceRequestEnable(256); }));
    EXPECT_EQ(0x10, status.serviceRequestEnable());
}

TEST(ErrorQueue, PopAllEmptiesTheQueueOldestFirst) {
    scpi::ErrorQueue q;
    EXPECT_EQ("0,\"No error\"", q.popAll());
    q.push(-113, "Undefined header");
    q.pushText("-222,\"Data out of range\"");
    EXPECT_EQ("-113,\"Undefined header\",-222,\"Data out of range\"", q.popAll());
    EXPECT_TRUE(q.empty());
}

}  // namespace
