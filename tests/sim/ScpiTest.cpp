#include <gtest/gtest.h>

#include "SimFixture.h"

namespace {

using simtest::SimFixture;

class Scpi : public SimFixture {
  protected:
    void SetUp() override { start(R"({"options": "010,080"})"); }
};

TEST_F(Scpi, StartUpQueriesAlsoAsOneCompoundMessage) {
    EXPECT_EQ("4;\"010,080\"", scpi("diag:portcount?;*OPT?"));
    EXPECT_EQ("\"C:\\Program Files (x86)\\Velquor\\Network Analyzer\"",
              scpi("SYST:CONF:DIRectory? APPLICATION"));
    EXPECT_EQ("\"Default\"", scpi("SYST:CONF:MWAV:CONF:CAT?"));
    EXPECT_EQ("0,\"No error\"", nextError());
}

TEST_F(Scpi, ErrorsAreQueuedInOrderForBadCommands) {
    EXPECT_EQ("", scpi("BOGUS:COMMAND 1"));
    scpi("SENS:AVER:COUN abc");
    scpi("CALC:FUNCTION:TYPE WIDTH");
    scpi("SENS:AVER:COUN 5,6");
    scpi("*IDN");  // the command form of a query-only header
    EXPECT_EQ("-113,\"Undefined header\"", nextError());
    EXPECT_EQ("-104,\"Data type error; number expected, got \"abc\"\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; statistic WIDTH\"", nextError());
    EXPECT_EQ("-108,\"Parameter not allowed\"", nextError());
    EXPECT_EQ("-113,\"Undefined header\"", nextError());
    EXPECT_EQ("0,\"No error\"", nextError());
}

TEST_F(Scpi, KeywordsMatchInShortAndLongFormAnyCase) {
    scpi("SENSe:PATH:CONFig:ELEMent:STATe \"Port1RefMxr\",\"External\"");
    EXPECT_EQ("\"EXTERNAL\"", scpi("sens:path:conf:elem? \"PORT1REFMXR\""));
    scpi("sense1:average:count 7");
    EXPECT_EQ("7", scpi("SENS:AVER:COUN?"));
    scpi("SOUR:POW -25,\"PORT 2\"");
    EXPECT_EQ("-2.50000000000E+01", scpi("SOURce:POWer? \"Port 2\""));
    // Port powers are coupled after a preset; uncoupled, each port keeps its own.
    EXPECT_EQ("-2.50000000000E+01", scpi("SOUR:POW? \"PORT 1\""));
    scpi("SOUR:POW:COUP OFF");
    scpi("SOUR:POW -5,\"PORT 1\"");
    EXPECT_EQ("-5.00000000000E+00", scpi("SOUR:POW? \"PORT 1\""));
    EXPECT_EQ("-2.50000000000E+01", scpi("SOUR:POW? \"PORT 2\""));
    scpi("SOUR:POW 40,\"PORT 1\"");
    scpi("SOUR:POW -20,\"PORT 9\"");
    EXPECT_EQ("-222,\"Data out of range; source power -90 to 20 dBm\"", nextError());
    EXPECT_EQ("-222,\"Data out of range; port 9\"", nextError());
    EXPECT_EQ("0,\"No error\"", nextError());
}

TEST_F(Scpi, IfPathAndMissingPathElements) {
    EXPECT_EQ("\"WBF\"", scpi("SENS:PATH:CONF:ELEM? \"IFSIGPATHALL\""));
    scpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"NBF\"");
    EXPECT_EQ("\"NBF\"", scpi("SENS:PATH:CONF:ELEM? \"IFSIGPATHALL\""));
    scpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"XYZ\"");
    EXPECT_EQ("", scpi("SENS:PATH:CONF:ELEM? \"NBFATNE\""));
    EXPECT_EQ("-224,\"Illegal parameter value; IF path XYZ\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; no path element \"NBFATNE\"\"", nextError());
}

// Engine commands that no other test here sends and checks.
TEST_F(Scpi, EngineSetUpCommandsAreAccepted) {
    for (const char* command : {"DIAG:RXCAL:STATE OFF",
                                "CALC:PAR:DEF:EXT \"measmag\",\"R1,1\"",
                                "DISP:WIND:TRACE1:FEED \"measmag\"",
                                "SENS:SWE:LFEX:STAT ON",
                                "DIAG:RXCAL:STATE ON",
                                "DIAG:CMPCAL:STATE ON",
                                "DIAG:MXCAL:STATE OFF",
                                "DIAG:SWEEP_PARM \"SweepParm\",\"TRUE\"",
                                "CALC:PAR:DEF:EXT \"measratio\",\"A/R1,1\"",
                                "DISP:WIND:TRACE2:FEED \"measratio\"",
                                "SENS:AVER:CLE",
                                "CALC:PAR:SEL \"measmag\"",
                                "CALC:FUNCTION:STAT ON",
                                "DISP:WIND:TRACE1:SEL",
                                "DISP:WIND:TRACE1:STAT ON",
                                "DISP:WIND:TRACE2:SEL",
                                "display:window:trace2:y:pdivision 0.1",
                                "format:data ASC",
                                "calculate:function:type MEAN",
                                "diag:mm:data:push 1,0"}) {
        SCOPED_TRACE(command);
        EXPECT_EQ("", scpi(command));
        EXPECT_EQ("0,\"No error\"", nextError());
    }
    EXPECT_EQ("1", scpi("SENS:SWE:LFEX:STAT?"));
    EXPECT_EQ("+1.00000000000E-01", scpi("DISP:WIND:TRACE2:Y:PDIV?"));
    EXPECT_EQ("\"measratio\"", scpi("CALC:PAR:SEL?"));
}

TEST_F(Scpi, MeasurementDefinitionsAreChecked) {
    scpi("CALC:PAR:DEF:EXT \"m\",\"E,1\"");
    scpi("CALC:PAR:DEF:EXT \"m\",\"A/R9,1\"");
    scpi("CALC:PAR:DEF:EXT \"m\",\"A,PORT 7\"");
    scpi("CALC:PAR:DEF:EXT \"m\",\"A,PORT 1\"");
    scpi("CALC:PAR:DEF:EXT \"m\",\"B,PORT 1\"");
    scpi("CALC:PAR:DEL \"nothing\"");
    scpi("DISP:WIND:TRACE3:SEL");
    EXPECT_EQ("-224,\"Illegal parameter value; unknown parameter \"E,1\"\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; unknown parameter \"A/R9,1\"\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; unknown parameter \"A,PORT 7\"\"", nextError());
    EXPECT_EQ("-200,\"Execution error; measurement \"m\" exists\"", nextError());
    EXPECT_EQ("-224,\"Illegal parameter value; no measurement named \"nothing\"\"", nextError());
    EXPECT_EQ("-221,\"Settings conflict; trace 3 shows no measurement\"", nextError());
    EXPECT_EQ("0,\"No error\"", nextError());
    EXPECT_EQ("\"CH1_S11_1,S11,m,A,PORT 1\"", scpi("CALC:PAR:CAT?"));
}

TEST_F(Scpi, ScenarioErrorRulesFireAfterMatchingCommandsOnly) {
    m_analyzer.reset();
    start(R"({"faults": {"scpi_errors": [{"command": "DIAG:FCAL",
        "errors": ["-200,\"Execution error\"", "-310,\"System error\""], "times": 2}]}})");
    scpi("DIAG:EEUPDATEHW");
    EXPECT_EQ("0,\"No error\"", nextError());
    for (int i = 0; i < 3; ++i) {
        scpi("diag:fcal:load");
    }
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ("-200,\"Execution error\"", nextError());
        EXPECT_EQ("-310,\"System error\"", nextError());
    }
    EXPECT_EQ("0,\"No error\"", nextError());
}

TEST_F(Scpi, TranscriptRecordsCommandsRepliesErrorsAndCalls) {
    m_analyzer->clearTranscript();
    scpi("*IDN?");
    scpi("NOPE");
    channel()->setSweepType(3);
    EXPECT_EQ(
        (std::vector<std::string>{"> *IDN?", "< Velquor Technologies,T3872A,MY00000001,A.13.55.06",
                                  "> NOPE", "! -113,\"Undefined header\"",
                                  "@ Application.activeChannel()", "@ Channel.setSweepType(3)"}),
        m_analyzer->transcript());
}

TEST_F(Scpi, TraceFileReceivesTheTranscript) {
    testsupport::TempDir dir;
    m_analyzer->setTraceFile(dir / "trace.txt");
    scpi("diag:portcount?");
    EXPECT_EQ("> diag:portcount?\n< 4\n", testsupport::readFile(dir / "trace.txt"));
    EXPECT_THROW(m_analyzer->setTraceFile(dir / "no" / "such" / "dir.txt"), std::string);
}

}  // namespace
