#include <gtest/gtest.h>

#include "scpi/CommandTable.h"

namespace {

// A small table whose handlers report which pattern ran, with its suffixes and parameter.
class CommandTableTest : public ::testing::Test {
  protected:
    void SetUp() override {
        for (const char* pattern :
             {"SENSe#:AVERage:[STATe]", "SENSe#:AVERage:COUNt", "SENSe#:AVERage:COUNt?",
              "FORMat:[DATA]", "FORMat:BORDer", "SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude]",
              "*CLS", "*IDN?"}) {
            std::string name = pattern;
            m_table.add(pattern, [name](scpi::CommandContext& c) {
                std::string ran = name;
                for (int s : c.suffixes) {
                    ran += " " + std::to_string(s);
                }
                if (!c.parameters.atEnd()) {
                    ran += " [" + c.parameters.word() + "]";
                }
                return ran;
            });
        }
    }
    // Runs a message unit by unit as an instrument does, returning what each unit ran.
    std::vector<std::string> run(std::string_view message) {
        std::vector<std::string> ran;
        std::vector<std::string> path;
        for (std::string_view unit : scpi::splitMessageUnits(message)) {
            const auto header = scpi::parseHeader(unit);
            scpi::ParameterReader parameters(header.parameters);
            try {
                ran.push_back(m_table.dispatch(header, unit.front() == ':', path, parameters));
            } catch (const scpi::Error& e) {
                ran.push_back(std::to_string(e.code));
            }
        }
        return ran;
    }
    scpi::CommandTable m_table;
};

TEST_F(CommandTableTest, FormsSuffixesAndOptionalNodes) {
    using V = std::vector<std::string>;
    EXPECT_EQ((V{"SENSe#:AVERage:COUNt 1 [5]", "SENSe#:AVERage:COUNt 2 [5]"}),
              run("sense:average:count 5;:SENS2:AVER:COUN 5"));
    EXPECT_EQ((V{"SENSe#:AVERage:COUNt? 12", "SENSe#:AVERage:[STATe] 1 [ON]"}),
              run("SENS12:AVER:COUN?;:SENS:AVER ON"));
    EXPECT_EQ((V{"SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude] 1 3 [X]",
                 "SOURce#:POWer#:[LEVel]:[IMMediate]:[AMPLitude] 2 1 [Y]"}),
              run("SOUR:POW3:LEV:IMM X;:SOURCE2:POWER:AMPL Y"));
    // Neither an abbreviation between the forms nor a query without its pattern matches.
    EXPECT_EQ((V{"-113", "-113", "-113"}), run("SENS:AVERA:COUN 1;:FORM:BORD?;:*IDN"));
}

// A unit continues the path of the one before it; when that finds nothing it is read from
// the root; a leading colon or a common command does not move the path.
TEST_F(CommandTableTest, CompoundMessagesFollowTheHeaderPath) {
    using V = std::vector<std::string>;
    EXPECT_EQ((V{"SENSe#:AVERage:COUNt 1 [5]", "SENSe#:AVERage:[STATe] 1 [ON]",
                 "SENSe#:AVERage:COUNt? 1"}),
              run("SENS:AVER:COUN 5;STAT ON;COUN?"));
    EXPECT_EQ((V{"FORMat:BORDer [SWAP]", "FORMat:[DATA] [REAL]"}), run("FORM:BORD SWAP;FORM REAL"));
    EXPECT_EQ((V{"SENSe#:AVERage:COUNt 1 [5]", "*CLS", "SENSe#:AVERage:[STATe] 1 [OFF]", "*IDN?",
                 "FORMat:[DATA] [ASC]", "-113"}),
              run("SENS:AVER:COUN 5;*CLS;STAT OFF;*IDN?;:FORM ASC;BORD NORM"));
}

}  // namespace
