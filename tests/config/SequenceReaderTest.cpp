#include <gtest/gtest.h>

#include <memory>

#include "ConfigTestFiles.h"
#include "ErrorOf.h"
#include "TempDir.h"
#include "config/ConfigurationFile.h"
#include "config/T3872Acomcal.h"

namespace {

using configtest::minimalConfiguration;
using configtest::replaced;
using Texts = std::vector<std::string>;

class SequenceReader : public ::testing::Test {
  protected:
    std::unique_ptr<CT3872Acomcal> read(const std::string& text,
                                        const std::string& model = "T3872A",
                                        const Texts& options = {"010"}) {
        testsupport::writeFile(path(), text);
        auto config = std::make_unique<CT3872Acomcal>();
        config->SetModel(model);
        config->SetOptions(options);
        config->ReadSequence(path());
        return config;
    }
    std::string errorOf(const std::string& text, const std::string& model = "T3872A") {
        return testsupport::errorOf([&] { read(text, model); });
    }
    std::string path() const { return (m_dir / "RcvrChar.dat").string(); }

    testsupport::TempDir m_dir;
};

TEST_F(SequenceReader, PortsAndPrerequisites) {
    auto config = read(minimalConfiguration());
    EXPECT_EQ(config->GetModelToken(), "T3872");
    EXPECT_EQ(config->RequiredPorts(), (Texts{"Port 1", "Port 2"}));
    EXPECT_EQ(config->GetPortAssignments(), (std::map<std::string, std::string>{{"Port 1", "R1"}}));
    bool portSearch = false;
    EXPECT_EQ(config->Prerequisites(config->RequiredPorts(), portSearch), Texts{"R1"});
    EXPECT_TRUE(portSearch);
    // An assignment naming a receiver of the list itself asks for nothing.
    EXPECT_EQ(config->Prerequisites({"Port 1", "R1"}, portSearch), Texts{});
    EXPECT_FALSE(portSearch);
    // "P" asks for a port search without a prerequisite.
    auto searched = read(replaced(replaced(minimalConfiguration(), ",Port 1,R1", ",Port 1,P"),
                                  ",Port 2,x", ",Port 2,R2"));
    EXPECT_EQ(searched->Prerequisites(searched->RequiredPorts(), portSearch), Texts{"R2"});
    EXPECT_TRUE(portSearch);
    auto direct = read(replaced(minimalConfiguration(), ",Port 1,R1", ",Port 1,x"));
    EXPECT_EQ(direct->Prerequisites(direct->RequiredPorts(), portSearch), Texts{});
    EXPECT_FALSE(portSearch);
}

TEST_F(SequenceReader, CalibrationsAndSubStepsFromTheirRows) {
    auto config = read(minimalConfiguration());
    ASSERT_EQ(config->GetCalibrations().size(), 3U);  // C is "0" for this model
    const CCalibration& r1 = config->Calibration("R1");
    EXPECT_EQ(r1.GetPort(), "Port 1,R1/A,\"RCVR R1 IN\"");
    EXPECT_EQ(r1.GetPathConfiguration(), "Path R1");
    EXPECT_EQ(r1.GetVerification(), "R1 Check");
    const CCalibration& a = config->Calibration("A");  // written "a" in the file
    EXPECT_EQ(a.GetVerification(), "None Set");
    const CCalibration& b = config->Calibration("B");
    EXPECT_EQ(b.GetPort(), "Port 2,B/R2,\"RCVR B IN\",Sweep B");
    EXPECT_EQ(b.GetCopyFrom(), "A");
    EXPECT_EQ(a.GetSubNames(), (Texts{"Sweep", "Check", "Sweep"}));
    EXPECT_EQ(configtest::positions(a), (std::vector<int>{3, 5, 7}));
    EXPECT_EQ(a.GetSubs()[1].GetIFBW(), 500);
    EXPECT_EQ(a.GetSubs()[1].GetNumPoints(), 11);
    EXPECT_FLOAT_EQ(a.GetSubs()[1].GetTolerance(), 0.1F);
    // An empty cell runs the sub-step at position 0; "0" leaves it out.
    ASSERT_EQ(b.SubCount(), 1);
    EXPECT_EQ(b.GetSubs()[0].GetName(), "Check");
    EXPECT_EQ(b.GetSubs()[0].GetPosition(), 0);
    auto noVerification = read(replaced(minimalConfiguration(), ",Verification Name", ""));
    EXPECT_EQ(noVerification->Calibration("R1").GetVerification(), "None Set");
}

TEST_F(SequenceReader, LongNamesReadTheirOwnSubStepColumn) {
    std::string text = replaced(minimalConfiguration(), ",C,0,", ",Delta,\"Port 2,D/R2,x\",");
    text = replaced(text, ",c7\n", ",c7,c8\n");
    text = replaced(text, "Rec-B\n", "Rec-B,Step DELTA\n");
    text = replaced(text, "1,\"3,7\",0\n", "1,\"3,7\",0,4\n");
    auto config = read(text);
    EXPECT_EQ(config->Calibration("DELTA").GetSubNames(), (Texts{"Check", "Sweep"}));
    text = replaced(text, "Step DELTA", "Step DELT");
    EXPECT_EQ(errorOf(text),
              "Column \"DELTA\" is missing from block \"SUBS / CALIBRATION\" of model T3872A in " +
                  path());
}

TEST_F(SequenceReader, ConstantsAreNamedRowsFollowedByNamedRows) {
    auto config = read(minimalConfiguration());
    EXPECT_EQ(config->GetConstant("maxband"), 4);
    EXPECT_EQ(config->GetConstant("pntsperband"), 5);
    EXPECT_FALSE(config->HasConstant("Required Ports"));
    EXPECT_FALSE(config->HasConstant(""));
    // Order / Power replaces the table's minband and sets the power range.
    EXPECT_EQ(config->GetConstant("minband"), 3);
    EXPECT_EQ(config->GetConstant("teststartpower"), -20);
    EXPECT_EQ(config->GetConstant("teststoppower"), 4);
    // The uppermost of two equal names wins.
    auto twice = read(
        replaced(minimalConfiguration(), "maxband,4\n", "maxband,4\nrefpower,-20\nREFPOWER,-30\n"));
    EXPECT_EQ(twice->GetConstant("refpower"), -20);
    // The last row is a constant only after a named row.
    std::string base = replaced(minimalConfiguration(),
                                "Order / Power,Selection,T3872\n"
                                ",Test Power,\"-20,4\"\n"
                                ",Cal Order,\"R1,&A&,B\"\n"
                                ",Minband,3\n",
                                "");
    auto lonely = read(replaced(base, ",S1,20,-60\n", ",S1,20,-60\nlonely,5\n"));
    EXPECT_FALSE(lonely->HasConstant("lonely"));
    auto pair = read(replaced(base, ",S1,20,-60\n", ",S1,20,-60\ntail1,1\ntail2,2\n"));
    EXPECT_EQ(pair->GetConstant("tail1"), 1);
    EXPECT_EQ(pair->GetConstant("tail2"), 2);
    // Without the block there is no order and the table's minband stays.
    Texts order{"stale"};
    pair->GetOrder(order);
    EXPECT_TRUE(order.empty());
    EXPECT_EQ(pair->GetConstant("minband"), 2);
    EXPECT_FALSE(pair->HasConstant("teststartpower"));
}

TEST_F(SequenceReader, OrderPowerPresetPowersAndSensors) {
    auto config = read(minimalConfiguration());
    Texts order;
    config->GetOrder(order);
    EXPECT_EQ(order, (Texts{"R1", "A", "B"}));
    // "Power" is tested before "Order".
    auto both =
        read(replaced(minimalConfiguration(), ",Test Power,\"-20,4\"", ",Order / Power,\"-25,5\""));
    EXPECT_EQ(both->GetConstant("teststartpower"), -25);
    EXPECT_EQ(both->GetConstant("teststoppower"), 5);
    EXPECT_EQ(config->GetPresetPowers(),
              (std::map<std::string, float>{{"R1", -10.5F}, {"B", -5.0F}}));
    ASSERT_EQ(config->GetSensorRanges().count("S1"), 1U);
    EXPECT_EQ(config->GetSensorRanges().at("S1").m_min, -60);
    EXPECT_EQ(config->GetSensorRanges().at("S1").m_max, 20);
    // Band building walks the port calibrations for every band row.
    EXPECT_EQ(config->GetCurrentCalibration(), "B");
}

TEST_F(SequenceReader, BandsFromTheBandedAndLfeBlocks) {
    auto config = read(minimalConfiguration());
    ASSERT_EQ(config->GetBands().size(), 3U);
    const BandDefaults& band = config->GetBandDefaults(3);
    EXPECT_EQ(band.m_startFreq, 2.1e9);
    EXPECT_EQ(band.m_stopFreq, 3e9);
    EXPECT_EQ(band.m_points, 10);
    EXPECT_EQ(band.m_powerLimit, 0);
    config->FirstBand();
    EXPECT_EQ(config->GetBandDefaults(-1).m_startFreq, 2.1e9);  // minband 3
    EXPECT_TRUE(config->GetLFEBands().empty());

    std::string text = replaced(minimalConfiguration(), "Stop_freq,Points,PowerLimit", "Stop_freq");
    text = replaced(text, ",2,1000000000,2000000000,11,5", ",2,1000000000,2000000000");
    auto bare = read(text);
    EXPECT_EQ(bare->GetBandDefaults(2).m_points, 5);  // pntsperband
    EXPECT_EQ(bare->GetBandDefaults(2).m_powerLimit, 30.0);
    EXPECT_EQ(bare->GetBandDefaults(3).m_points, 5);
    // A repeated band number keeps the lower row.
    auto repeated = read(replaced(minimalConfiguration(), ",4,3100000000", ",3,3100000000"));
    EXPECT_EQ(repeated->GetBands().size(), 2U);
    EXPECT_EQ(repeated->GetBandDefaults(3).m_startFreq, 3.1e9);

    auto lfe = read(replaced(minimalConfiguration(), "Power Range / Sensor",
                             "LFE Bands,BandNum,Start_freq,Stop_freq,Points\n"
                             ",0,100000,1100000,11\n"
                             ",1,1500000,9500000,17\n"
                             "Power Range / Sensor"));
    ASSERT_EQ(lfe->GetLFEBands().size(), 2U);
    EXPECT_EQ(lfe->GetLFEBandDefaults(1).m_points, 17);
    EXPECT_EQ(lfe->GetLFEBandDefaults(1).m_powerLimit, 30.0);
    EXPECT_EQ(lfe->GetBands().size(), 3U);
}

TEST_F(SequenceReader, OptionColumnsChooseValues) {
    std::string text = replaced(minimalConfiguration(), "Path Configuration,",
                                "Path Configuration,Path Configuration AOPT=080,");
    text = replaced(text, "Path R1,", "Path R1,Path R1 080,");
    text = replaced(text, "Preset Powers,Calibration Names,T3872",
                    "Preset Powers,Calibration Names,T3872,T3872 OOPT=010 080");
    text = replaced(text, ",R1,-10.5", ",R1,-10.5,-3");
    auto plain = read(text, "T3872A", {"010"});
    EXPECT_EQ(plain->Calibration("R1").GetPathConfiguration(), "Path R1");
    EXPECT_EQ(plain->GetPresetPowers().at("R1"), -10.5F);
    auto both = read(text, "T3872A", {"080", "010"});
    EXPECT_EQ(both->Calibration("R1").GetPathConfiguration(), "Path R1 080");
    EXPECT_EQ(both->GetPresetPowers().at("R1"), -3.0F);
}

TEST_F(SequenceReader, FaultsAreNamedWithFileBlockAndColumn) {
    struct Case {
        std::string what, with;  // edit of the minimal configuration; no what: the whole text
        std::string expected;    // @ stands for the file's path
        std::string model = "T3872A";
    };
    const Case cases[] = {
        {"3000000000,10,0", "3000000000,1,0",
         "Band 3 of block \"BANDED\" has 1 points in @; a band needs 0 or at least 2"},
        {"BandNum,", "Band,", "Column \"BandNum\" is missing from block \"BANDED\" in @"},
        {",Test Power,\"-20,4\"", ",Test Power,-20",
         "The \"Order / Power\" row \"Test Power\" of model T3872A in @ needs two powers, start "
         "and stop, but reads \"-20\""},
        {"Preset Powers,", "Preset Levels,",
         "Block \"Preset Powers\" is missing from the table of model T3872A in @"},
        {"Port Names", "Port Labels",
         "Column \"Port Names\" is missing from block \"REQUIRED PORTS\" of model T3872A in @"},
        {"Rec-B", "Rec-Q",
         "Column \"Rec-B\" is missing from block \"SUBS / CALIBRATION\" of model T3872A in @"},
        {"T3871 T3872 T3877", "T3951", "Model T3872A is not listed in the first cell of @"},
        {"", "T3872\n\nT3872A,Value\nminband,2\n\n",
         "The table of model T3872A in @ needs at least two rows below the row naming the model"},
    };
    for (const Case& c : cases) {
        std::string text =
            c.what.empty() ? c.with : replaced(minimalConfiguration(), c.what, c.with);
        std::string expected = c.expected;
        if (auto at = expected.find('@'); at != std::string::npos) {
            expected.replace(at, 1, path());
        }
        EXPECT_EQ(errorOf(text, c.model), expected) << c.what << " -> " << c.with;
    }
}

TEST_F(SequenceReader, ModelAndOptionsMustBeSetFirst) {
    testsupport::writeFile(path(), minimalConfiguration());
    auto error = [&](CT3872Acomcal& config) {
        return testsupport::errorOf([&] { config.ReadSequence(path()); });
    };
    CT3872Acomcal noOptions;
    noOptions.SetModel("T3872A");
    EXPECT_EQ(error(noOptions), "No Options set for CNAData::GetSequence");
    noOptions.SetOptions({});
    EXPECT_EQ(error(noOptions), "No Options set for CNAData::GetSequence");
    CT3872Acomcal noModel;
    noModel.SetOptions({"010"});
    EXPECT_EQ(error(noModel), "No Model Set in CNAData::GetSequence");
    noModel.SetModel("None Set");
    EXPECT_EQ(error(noModel), "No Model Set in CNAData::GetSequence");
    // Callers written for the original catch these two as plain character strings and the
    // file's own faults as string objects.
    EXPECT_THROW(noModel.ReadSequence(path()), const char*);
    EXPECT_THROW(noOptions.ReadSequence(path()), const char*);
    CT3872Acomcal missingFile;
    missingFile.SetModel("T3872A");
    missingFile.SetOptions({"010"});
    EXPECT_THROW(missingFile.ReadSequence(path() + ".absent"), std::string);
}

TEST(ModelToken, DropsUpToTwoCharacters) {
    EXPECT_EQ(ConfigurationFile::ModelToken("T3871 T3872 T3877", "T3872A"), "T3872");
    EXPECT_EQ(ConfigurationFile::ModelToken("T3871 T3872B", "T3872B"), "T3872B");
    EXPECT_EQ(ConfigurationFile::ModelToken("T3872A,T3877", "T3872ABC"), "T3872A");
    EXPECT_EQ(ConfigurationFile::ModelToken("T3872", "T3872ABC"), "");
    EXPECT_EQ(ConfigurationFile::ModelToken("t3872", "T3872"), "");  // case matters here
    EXPECT_EQ(ConfigurationFile::ModelToken("T3872", "AB"), "");     // never an empty search
}

}  // namespace
