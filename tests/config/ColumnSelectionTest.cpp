#include <gtest/gtest.h>

#include <sstream>

#include "ErrorOf.h"
#include "config/CSVExtra.h"
#include "config/OptionReply.h"
#include "config/Split.h"

namespace {

using testsupport::errorOf;

TEST(OptionRules, ChooseLastQualifyingHeading) {
    using Texts = std::vector<std::string>;
    const Texts plainAnd010And080{"T3872", "T3872 AOPT=010", "T3872 AOPT=080"};
    const Texts anyOf{"T3872 AOPT= 010 080 !029"};
    const Texts onlyThese{"T3872 OOPT= 010 080"};
    struct Case {
        Texts installed;
        Texts headings;
        std::string chosen;
    };
    const Case cases[] = {
        {{"080"}, plainAnd010And080, "T3872 AOPT=080"},
        {{"010"}, plainAnd010And080, "T3872 AOPT=010"},
        {{"010", "080"}, plainAnd010And080, "T3872 AOPT=080"},
        {{"029"}, plainAnd010And080, "T3872"},
        {{"080"}, {"T3872 AOPT=080", "T3872"}, "T3872"},
        // Any listed option, unless an excluded one is installed.
        {{"010"}, anyOf, anyOf[0]},
        {{"010", "029"}, anyOf, ""},
        {{"010"}, {"T3872 AOPT= !029"}, "T3872 AOPT= !029"},
        {{"029"}, {"T3872 AOPT= !029 030"}, ""},
        {{"010"}, {"T3872 AOPT="}, ""},
        {{"01"}, {"T3872 AOPT=010"}, ""},  // words compare whole
        // Exactly the listed options, in any order.
        {{"010", "080"}, onlyThese, onlyThese[0]},
        {{"080", "010"}, onlyThese, onlyThese[0]},
        {{"010", "080", "029"}, onlyThese, ""},
        {{"010"}, onlyThese, ""},
        {{"1ce"}, {"T3872 OOPT=1CE"}, ""},  // lower-case codes never match upper-cased headings
        {{"1CE"}, {"T3872 OOPT=1CE"}, "T3872 OOPT=1CE"},
    };
    for (const Case& c : cases) {
        CCSVExtra csv;
        csv.SetSelection(c.installed, "T3872A");
        EXPECT_EQ(csv.ChooseCandidate(c.headings), c.chosen)
            << c.headings.front() << " with " << c.installed.front();
    }
}

class Selection : public ::testing::Test {
  protected:
    void SetUp() override {
        std::istringstream in(
            "T3872A,a,b,c,d\n"
            "Preset Powers,Names,T3872,T3872 AOPT=080,Other\n"
            ",R1,-10,-12,x\n");
        ASSERT_TRUE(m_csv.Load(in, false));
        m_csv.SetHeaderFlag(false);
        m_csv.CreateTable("T3872A", true);
        m_block = m_csv.CreateSubTable("T3872A", "Preset Powers");
        ASSERT_NE(m_block, nullptr);
        m_block->SetHeaderFlag(true);
    }
    CCSVExtra m_csv;
    CCSVTable* m_block = nullptr;
};

TEST_F(Selection, SelectColumnGivesIndexInBlock) {
    m_csv.SetSelection({"080"}, "T3872A");
    EXPECT_EQ(m_csv.SelectColumn("Preset Powers", {"T3872"}), 3);
    m_csv.SetSelection({"010"}, "T3872A");
    EXPECT_EQ(m_csv.SelectColumn("preset powers", {"t3872"}), 2);
    m_csv.SetSelection({"080"}, "T3872A");
    EXPECT_EQ(m_csv.SelectColumn("Preset Powers", {"T3872", "AOPT"}), 3);
    EXPECT_EQ(m_csv.SelectColumn("Preset Powers", {"other"}), 4);
}

TEST_F(Selection, RowsAndColumnsWithoutCandidatesNameThePartials) {
    m_csv.SetSelection({"010"}, "T3872A");
    EXPECT_EQ(errorOf([&] { m_csv.SelectColumn("Preset Powers", {"T3999"}); }),
              "Column was not found, Partials searched forT3999 and that's it!");
    // An option column whose options are not installed is no candidate.
    EXPECT_EQ(errorOf([&] {
                  m_csv.FindSelection(*m_block, {"T3872", "AOPT"}, true, true);
              }),
              "Column was not found, Partials searched forT3872 andAOPT and that's it!");
    EXPECT_EQ(m_csv.FindSelection(*m_block, {"T3999"}, false, false), "");
    m_block->SetHeaderFlag(false);
    EXPECT_EQ(m_csv.FindSelection(*m_block, {"preset"}, false, true), "Preset Powers");
    EXPECT_EQ(errorOf([&] { m_csv.FindSelection(*m_block, {"Nothing"}, false, true); }),
              "Row was not found, Partials searched forNothing and that's it!");
}

TEST(SplitText, DelimiterRunsCountAsOneAndGroupsKeepDelimiters) {
    const std::pair<std::string, std::vector<std::string>> cases[] = {
        {"R1,,A", {"R1", "A"}},
        {",,", {}},
        {"", {}},
        {" -30, 0", {" -30", " 0"}},
        {"R1,&R1 LOW, HIGH&,B", {"R1", "R1 LOW, HIGH", "B"}},
        // An unclosed group is dropped and scanning resumes after its opening character.
        {"&open,b", {"open", "b"}},
        {"a,&&,b", {"a", "b"}},
    };
    for (const auto& [text, expected] : cases) {
        std::vector<std::string> tokens{"stale"};
        EXPECT_EQ(Split(text, tokens, ",", '&'), static_cast<int>(expected.size())) << text;
        EXPECT_EQ(tokens, expected) << text;
    }
}

TEST(SplitText, WordsSplitAtBlanksAndTabsWithQuotes) {
    std::vector<std::string> words;
    EXPECT_EQ(SplitWords(" 010\t080  \"1 CE\" ", words), 3);
    EXPECT_EQ(words, (std::vector<std::string>{"010", "080", "1 CE"}));
}

TEST(OptionReply, SplitsAtCommasWithNoOptionsForEmptyText) {
    EXPECT_EQ(SplitOptionReply("010,080,029"), (std::vector<std::string>{"010", "080", "029"}));
    EXPECT_EQ(SplitOptionReply(""), (std::vector<std::string>{"No Options"}));
    EXPECT_EQ(SplitOptionReply("010,"), (std::vector<std::string>{"010", "No Options"}));
    EXPECT_EQ(SplitOptionReply(",010"), (std::vector<std::string>{"", "010"}));
}

}  // namespace
