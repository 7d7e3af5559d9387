#include <gtest/gtest.h>

#include "ErrorOf.h"
#include "analyzer/remote/MessageQueries.h"
#include "analyzer/remote/ResourceString.h"

using remote::ResourceString;

TEST(ResourceString, SocketAndInstrForms) {
    struct Case {
        const char* text;
        ResourceString::Kind kind;
        const char* host;
        int port;
        const char* device;
    };
    const Case cases[] = {
        {"TCPIP::127.0.0.1::5025::SOCKET", ResourceString::Kind::Socket, "127.0.0.1", 5025,
         "inst0"},
        {"tcpip0::analyzer-7.lab::socket", ResourceString::Kind::Socket, "analyzer-7.lab", 5025,
         "inst0"},
        {"TCPIP1::[::1]::6000::SOCKET", ResourceString::Kind::Socket, "::1", 6000, "inst0"},
        {"TCPIP::127.0.0.7::INSTR", ResourceString::Kind::Vxi11, "127.0.0.7", 5025, "inst0"},
        {"TCPIP::[::1%lo]::inst1::INSTR", ResourceString::Kind::Vxi11, "::1%lo", 5025, "inst1"},
    };
    for (const auto& c : cases) {
        const ResourceString r = remote::parseResourceString(c.text);
        EXPECT_EQ(r.kind, c.kind) << c.text;
        EXPECT_EQ(r.host, c.host) << c.text;
        EXPECT_EQ(r.port, c.port) << c.text;
        EXPECT_EQ(r.device, c.device) << c.text;
        EXPECT_EQ(r.text, c.text);
    }
}

TEST(ResourceString, WhatCannotBeReadNamesTheFaultAndTheAcceptedForms) {
    const std::pair<const char*, const char*> cases[] = {
        {"GPIB::7::INSTR", "does not start with TCPIP"},
        {"TCPIPx::host::SOCKET", "does not start with TCPIP"},
        {"TCPIP::host", "has 2 fields"},
        {"TCPIP::host::5025::extra::SOCKET", "has 5 fields"},
        {"TCPIP::::5025::SOCKET", "\"\" is not a host"},
        {"TCPIP::ho st::SOCKET", "\"ho st\" is not a host"},
        {"TCPIP::::1::5025::SOCKET", "has 5 fields"},
        {"TCPIP::host::0::SOCKET", "\"0\" is not a port number"},
        {"TCPIP::host::70000::SOCKET", "\"70000\" is not a port number"},
        {"TCPIP::host::50x::SOCKET", "\"50x\" is not a port number"},
        {"TCPIP::host::5025::HISLIP", "ends in \"HISLIP\""},
        {"TCPIP::host::::INSTR", "device name is empty"},
    };
    for (const auto& [text, why] : cases) {
        const std::string error = testsupport::errorOf([&] { remote::parseResourceString(text); });
        EXPECT_NE(error.find(std::string("\"") + text + "\" cannot be reached: "),
                  std::string::npos)
            << error;
        EXPECT_NE(error.find(why), std::string::npos) << text << ": " << error;
        EXPECT_NE(error.find("TCPIP[n]::HOST[::PORT]::SOCKET"), std::string::npos);
        EXPECT_NE(error.find("TCPIP[n]::HOST[::DEVICE]::INSTR"), std::string::npos);
    }
    EXPECT_TRUE(remote::isLanResource("tcpip::x::SOCKET"));
    EXPECT_FALSE(remote::isLanResource("sim:TCPIP.json"));
}

TEST(MessageQueries, AQuestionMarkCountsOnlyInAHeader) {
    EXPECT_TRUE(remote::holdsQuery("*IDN?"));
    EXPECT_TRUE(remote::holdsQuery("  SYST:ERR?"));
    EXPECT_TRUE(remote::holdsQuery("SENS:AVER:COUN 4;:CALC:FUNC:DATA?"));
    EXPECT_TRUE(remote::holdsQuery("SENS:PATH:CONF:ELEM? \"NBFATNA\""));
    EXPECT_FALSE(remote::holdsQuery("DISP:WIND:TRAC:FEED \"what?\""));
    EXPECT_FALSE(remote::holdsQuery("CALC:PAR:DEF:EXT 'a?b','R1,PORT 1'"));
    EXPECT_FALSE(remote::holdsQuery("MMEM:TRAN \"x.dat\",#15ab?de;"));
    EXPECT_FALSE(remote::holdsQuery("MMEM:TRAN \"x.dat\",#15ab;?d"));
    EXPECT_FALSE(remote::holdsQuery(""));
    EXPECT_FALSE(remote::holdsQuery("SENS:SWE:MODE SING"));
}
