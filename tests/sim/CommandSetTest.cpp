#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <filesystem>
#include <fstream>

#include "SimFixture.h"
#include "scpi/NumberFormat.h"
#include "sim/Instrument.h"

namespace {

using simtest::SimFixture;

class CommandSet : public SimFixture {
  protected:
    void SetUp() override { start(); }
    std::string errors() {
        std::string all;
        for (std::string e = nextError(); e != "0,\"No error\""; e = nextError()) {
            all += e + "\n";
        }
        return all;
    }
    // A two-segment sweep of a ratio and a receiver, swept once.
    void sweepTwoSegments() {
        scpi("CALC:PAR:DEL:ALL");
        scpi("CALC:PAR:DEF:EXT \"ratio\",\"A/R1,1\"");
        scpi("CALC:PAR:DEF:EXT \"mag\",\"A,1\"");
        scpi("SENS:SWE:TYPE SEGM");
        scpi("SENS:SEGM:LIST SSTOP,2, 1,3,1e9,2e9,1000,0,-10, 1,2,5e9,6e9,1000,0,0");
        scpi("SENS:SEGM:POW:CONT ON");
        scpi("SENS:SWE:MODE SING");
        ASSERT_EQ("", errors());
    }
};

// Settings made through one way in read back through the other: one handler serves both.
TEST_F(CommandSet, AutomationCallsAndScpiReachTheSameSettings) {
    auto ch = channel();
    ch->setSweepType(2);
    EXPECT_EQ("POW", scpi("SENS:SWE:TYPE?"));
    scpi("SENS1:SWEep:TYPE cw");
    ch->setCwFrequency(3e9);
    EXPECT_EQ("+3.00000000000E+09", scpi("SENS:FREQ:CW?"));
    EXPECT_DOUBLE_EQ(3e9, ch->startFrequency());
    ch->setStartPower(-20);
    scpi("SOUR:POW:STOP -5");
    EXPECT_EQ("-2.00000000000E+01;-5.00000000000E+00", scpi("SOUR:POW:STAR?;STOP?"));
    EXPECT_DOUBLE_EQ(-5, ch->stopPower());
    scpi("SENS:SWE:POIN 11");
    EXPECT_EQ(11, ch->numberOfPoints());
    ch->setIfBandwidth(300);
    EXPECT_EQ("+3.00000000000E+02", scpi("SENS:BWID?"));
    ch->setAttenuatorMode(3, 1);
    EXPECT_EQ("0;1", scpi("SOUR:POW3:ATT:AUTO?;:SOUR:POW2:ATT:AUTO?"));
    ch->setIfBandwidthSwitch(false);
    EXPECT_EQ("0", scpi("SENS:BWID:TRAC?"));
    ch->setTriggerSetting(1);
    m_app->setTriggerSetting(3);
    EXPECT_EQ("SWE;MAN", scpi("SENS:SWE:TRIG:MODE?;:TRIG:SOUR?"));

    // The same refusal, queued for SCPI and raised for an automation call.
    scpi("SENS:SWE:POIN 0");
    EXPECT_EQ("-222,\"Data out of range\"\n", errors());
    try {
        ch->setNumberOfPoints(200000);
        ADD_FAILURE() << "no error";
    } catch (const std::string& text) {
        EXPECT_NE(std::string::npos, text.find("Channel.setNumberOfPoints(200000)")) << text;
        EXPECT_NE(std::string::npos, text.find("200000 points is outside 1 to 100001")) << text;
    }
    scpi("SENS2:SWE:POIN 5");
    scpi("SOUR:POW9:ATT:AUTO ON");
    scpi("SENS:SWE:TYPE RADIAL");
    EXPECT_EQ(
        "-114,\"Header suffix out of range; no channel 2\"\n"
        "-114,\"Header suffix out of range; no port 9\"\n"
        "-224,\"Illegal parameter value; sweep type RADIAL\"\n",
        errors());
    EXPECT_EQ("", errors());
}

TEST_F(CommandSet, SegmentTableAndSweepStateFollowTheAnalyzer) {
    // The type is accepted before the table; the sweep is refused while no segment is on.
    scpi("SENS:SWE:TYPE SEGM");
    scpi("SENS:SEGM:LIST SSTOP,1, 0,5,1e9,2e9,1000,0,-10");
    EXPECT_EQ("", errors());
    scpi("INIT:IMM");
    EXPECT_EQ("-221,\"Settings conflict; segment sweep with no segment on\"\n", errors());

    sweepTwoSegments();
    EXPECT_EQ("HOLD", scpi("SENS:SWE:MODE?"));
    EXPECT_EQ("2;5", scpi("SENS:SEGM:COUN?;:SENS:SWE:POIN?"));
    EXPECT_EQ(
        "+2.00000000000E+00,+1.00000000000E+00,+3.00000000000E+00,+1.00000000000E+09,"
        "+2.00000000000E+09,+1.00000000000E+03,+0.00000000000E+00,-1.00000000000E+01,"
        "+1.00000000000E+00,+2.00000000000E+00,+5.00000000000E+09,+6.00000000000E+09,"
        "+1.00000000000E+03,+0.00000000000E+00,+0.00000000000E+00",
        scpi("SENS:SEGM:LIST? SSTOP"));
    EXPECT_EQ(
        "+1.00000000000E+09,+1.50000000000E+09,+2.00000000000E+09,+5.00000000000E+09,"
        "+6.00000000000E+09",
        scpi("SENS:X?"));
    scpi("SENS:SEGM:LIST SSTOP,1, 1,0,1e9,2e9,1000,0,-10");
    scpi("SENS:SEGM:LIST SSTOP,2, 1,2,1e9,2e9,1000,0,-10");
    EXPECT_EQ(
        "-222,\"Data out of range; segment 1: points must be a whole number of at least 1, not "
        "+0.00000000000E+00\"\n-109,\"Missing parameter\"\n",
        errors());
    EXPECT_EQ("2", scpi("SENS:SEGM:COUN?"));
    scpi("SENS:SEGM:DEL:ALL");
    EXPECT_EQ("0", scpi("SENS:SEGM:COUN?"));
    scpi("SENS:SWE:MODE CONT");
    EXPECT_EQ("-221,\"Settings conflict; segment sweep with no segment on\"\n", errors());
}

// Trace data in every format and byte order carries the same values as the ASCII reply.
TEST_F(CommandSet, TraceDataInEveryFormatAndByteOrder) {
    sweepTwoSegments();
    scpi("CALC:PAR:SEL \"ratio\"");
    const std::string asciiReply = scpi("CALC:DATA? FDATA");
    const std::vector<double> ascii =
        scpi::decodeValues(asciiReply, scpi::DataFormat::Ascii, scpi::ByteOrder::Normal);
    ASSERT_EQ(5u, ascii.size());
    EXPECT_LT(ascii[3], ascii[0]);  // the second segment's 0 dBm compresses A more than -10 dBm
    struct Case {
        const char* command;
        scpi::DataFormat format;
        scpi::ByteOrder order;
        double tolerance;
    };
    for (const Case& c :
         {Case{"FORM REAL,32", scpi::DataFormat::Real32, scpi::ByteOrder::Normal, 1e-6},
          Case{"FORM:BORD SWAP;FORM REAL,32", scpi::DataFormat::Real32, scpi::ByteOrder::Swapped,
               1e-6},
          Case{"FORM:BORD NORM;FORM:DATA REAL,64", scpi::DataFormat::Real64,
               scpi::ByteOrder::Normal, 1e-9},
          Case{"FORM:BORD SWAP;FORM REAL,64", scpi::DataFormat::Real64, scpi::ByteOrder::Swapped,
               1e-9}}) {
        SCOPED_TRACE(c.command);
        scpi(c.command);
        ASSERT_EQ("", errors());
        const std::string reply = scpi("CALC:DATA? FDATA");
        ASSERT_EQ('#', reply.front());
        const auto values = scpi::decodeValues(reply, c.format, c.order);
        ASSERT_EQ(ascii.size(), values.size());
        for (std::size_t i = 0; i < values.size(); ++i) {
            EXPECT_NEAR(ascii[i], values[i], c.tolerance) << i;
        }
    }
    // Big-endian unless swapped: the first byte of a REAL,64 1.0 is 0x3F.
    scpi("FORM:BORD NORM;:CALC:FORM MLIN");
    EXPECT_EQ("REAL,64;NORM;MLIN", scpi("FORM?;FORM:BORD?;:CALC:FORM?"));
    const std::string linear = scpi("CALC:DATA? FDATA");
    EXPECT_EQ(0x3F, static_cast<unsigned char>(linear[linear.find('#') + 2 + (linear[1] - '0')]));

    // Complex data: real and imaginary of each point, whose magnitude is the log reading.
    scpi("FORM ASC;:CALC:PAR:SEL \"mag\";:CALC:FORM MLOG");
    const auto mag = scpi::decodeValues(scpi("CALC:DATA? FDATA"), scpi::DataFormat::Ascii,
                                        scpi::ByteOrder::Normal);
    const auto complex = scpi::decodeValues(scpi("CALC:DATA? SDATA"), scpi::DataFormat::Ascii,
                                            scpi::ByteOrder::Normal);
    ASSERT_EQ(2 * mag.size(), complex.size());
    for (std::size_t i = 0; i < mag.size(); ++i) {
        EXPECT_NEAR(mag[i],
                    10 * std::log10(complex[2 * i] * complex[2 * i] +
                                    complex[2 * i + 1] * complex[2 * i + 1]),
                    1e-4);
    }
    // A numbered measurement reads without moving the selection; so does the automation.
    EXPECT_EQ("\"2,3\"", scpi("SYST:MEAS:CAT?"));
    EXPECT_EQ("\"ratio\";\"A/R1,1\"", scpi("SYST:MEAS2:NAME?;:CALC:MEAS2:PAR?"));
    EXPECT_EQ(asciiReply, scpi("CALC:MEAS2:FORM MLOG;DATA? FDATA"));
    EXPECT_EQ("\"mag\";3", scpi("CALC:PAR:SEL?;MNUM?"));
    EXPECT_EQ(5u, read("ratio").size());
    EXPECT_EQ("\"mag\"", scpi("CALC:PAR:SEL?"));
    scpi("CALC:DATA? XDATA");
    EXPECT_EQ("-224,\"Illegal parameter value; data XDATA, FDATA or SDATA expected\"\n", errors());
}

// IEEE 488.2 status: error classes in the event register, summary bits in the status byte,
// and *OPC? waiting for the sweep in progress on the instrument's clock.
TEST_F(CommandSet, CommonCommandsKeepTheStatusRegisters) {
    EXPECT_EQ("128;0;0", scpi("*ESR?;*ESR?;*STB?"));  // power-on, read once
    scpi("NOPE");
    scpi("SENS:AVER:COUN 0");
    EXPECT_EQ("4", scpi("*STB?"));   // EAV: the queue holds errors
    EXPECT_EQ("48", scpi("*ESR?"));  // CME and EXE
    EXPECT_EQ("0", scpi("*ESR?"));
    EXPECT_EQ("-113,\"Undefined header\",-222,\"Data out of range\"", scpi("SYST:ERR:ALL?"));
    EXPECT_EQ("0,\"No error\"", scpi("SYST:ERR:ALL?"));
    scpi("*ESE 32;*SRE 32");
    scpi("BAD");
    EXPECT_EQ("32;32;100", scpi("*ESE?;*SRE?;*STB?"));  // EAV, ESB and MSS
    scpi("*CLS");
    EXPECT_EQ("0;0", scpi("*STB?;*ESR?"));
    scpi("*ESE 256");
    EXPECT_NE("", errors());
    scpi("*CLS");

    const auto before = m_analyzer->instrument().clock().totalWaited();
    scpi("SENS:SWE:POIN 2001;:SENS:BWID 1000");
    scpi("SENS:SWE:MODE SING;*OPC");
    EXPECT_EQ("1", scpi("*OPC?"));
    EXPECT_EQ(std::chrono::milliseconds(2001),
              m_analyzer->instrument().clock().totalWaited() - before);
    EXPECT_EQ("1", scpi("*ESR?"));  // OPC
    EXPECT_EQ("0", scpi("*TST?"));
}

TEST_F(CommandSet, CompoundMessagesFollowTheHeaderPath) {
    EXPECT_EQ("7;1", scpi("SENS:AVER:COUN 7;STAT ON;COUN?;STAT?"));
    EXPECT_EQ("REAL,64;SWAP", scpi("FORM:BORD SWAP;FORM REAL,64;FORM?;:FORM:BORD?"));
    EXPECT_EQ("", errors());
    scpi("SENS:AVER:COUN 3;POIN 5");
    EXPECT_EQ("-113,\"Undefined header\"\n", errors());
}

TEST_F(CommandSet, FilesStayOnTheAnalyzersDrive) {
    const std::string bytes("line 1\nsemi;colon \"quote\"\0end", 29);
    const std::string block = "#2" + std::to_string(bytes.size()) + bytes;
    scpi("MMEM:MDIR \"C:\\Cal\"");
    scpi("MMEM:TRAN \"C:\\Cal\\data.bin\"," + block);
    EXPECT_EQ("", errors());
    EXPECT_EQ(block, scpi("MMEM:TRAN? \"c:/Cal/data.bin\""));
    const std::string listing = scpi("MMEM:CAT? \"C:\\Cal\"");
    EXPECT_EQ(0u, listing.find("29,")) << listing;
    EXPECT_NE(std::string::npos, listing.find(",\"data.bin,FILE,29,")) << listing;

    const auto outside = m_state.path() / "outside.txt";
    std::filesystem::create_directory_symlink(m_state.path(), m_analyzer->driveRoot() / "link");
    for (const std::string& name : std::vector<std::string>{
             "..\\outside.txt", "C:\\Cal\\..\\..\\outside.txt", outside.string(), "D:\\outside.txt",
             "C:\\link\\outside.txt", "C:\\Missing\\x.bin"}) {
        SCOPED_TRACE(name);
        scpi("MMEM:TRAN \"" + name + "\",#13abc");
        EXPECT_EQ(0u, errors().find("-256,\"File name not found; \"" + name + "\""));
    }
    EXPECT_FALSE(std::filesystem::exists(outside));
    scpi("MMEM:TRAN? \"C:\\link\\flash\"");
    EXPECT_EQ(0u, errors().find("-256,"));

    // Indefinite and oversized blocks are refused before anything is kept.
    scpi("MMEM:TRAN \"C:\\Cal\\x.bin\",#0abc");
    scpi("MMEM:TRAN \"C:\\Cal\\x.bin\",#9999999999");
    const std::string refusals = errors();
    EXPECT_EQ(0u, refusals.find("-161,")) << refusals;
    EXPECT_NE(std::string::npos, refusals.find("\n-161,")) << refusals;
    EXPECT_FALSE(std::filesystem::exists(m_analyzer->driveRoot() / "Cal" / "x.bin"));

    scpi("MMEM:DEL \"C:\\Cal\\data.bin\"");
    scpi("MMEM:DEL \"C:\\Cal\\data.bin\"");
    scpi("MMEM:MDIR \"C:\\Cal\"");
    EXPECT_EQ(
        "-256,\"File name not found; \"C:\\Cal\\data.bin\" does not exist\"\n"
        "-257,\"File name error; \"C:\\Cal\" exists\"\n",
        errors());
}

}  // namespace
