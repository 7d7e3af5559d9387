#include <gtest/gtest.h>

#include <sstream>

#include "config/CSVExtra.h"
#include "config/OptionReply.h"
#include "config/Split.h"

namespace {

std::string choose(const std::vector<std::string>& installed,
                   const std::vector<std::string>& headings) {
    CCSVExtra csv;
    csv.SetSelection(installed, "T3872A");
    return csv.ChooseCandidate(headings);
}

TEST(OptionRules, LastQualifyingHeadingWins) {
    const std::vector<std::string> headings{"T3872", "T3872 AOPT=010", "T3872 AOPT=080"};
    EXPECT_EQ(choose({"080"}, headings), "T3872 AOPT=080");
    EXPECT_EQ(choose({"010"}, headings), "T3872 AOPT=010");
    EXPECT_EQ(choose({"010", "080"}, headings), "T3872 AOPT=080");
    EXPECT_EQ(choose({"029"}, headings), "T3872");
    EXPECT_EQ(choose({"080"}, {"T3872 AOPT=080", "T3872"}), "T3872");
}

TEST(OptionRules, AnyOptionWithExclusions) {
    EXPECT_EQ(choose({"010"}, {"T3872 AOPT= 010 080 !029"}), "T3872 AOPT= 010 080 !029");
    EXPECT_EQ(choose({"010", "029"}, {"T3872 AOPT= 010 080 !029"}), "");
    // Only exclusions: qualifies unless an excluded option is installed.
    EXPECT_EQ(choose({"010"}, {"T3872 AOPT= !029"}), "T3872 AOPT= !029");
    EXPECT_EQ(choose({"029"}, {"T3872 AOPT= !029 030"}), "");
    // Neither options nor exclusions: never.
    EXPECT_EQ(choose({"010"}, {"T3872 AOPT="}), "");
    // Words compare whole: 01 is not 010.
    EXPECT_EQ(choose({"01"}, {"T3872 AOPT=010"}), "");
}

TEST(OptionRules, OnlyTheseOptions) {
    const std::string heading = "T3872 OOPT= 010 080";
    EXPECT_EQ(choose({"010", "080"}, {heading}), heading);
    EXPECT_EQ(choose({"080", "010"}, {heading}), heading);
    EXPECT_EQ(choose({"010", "080", "029"}, {heading}), "");
    EXPECT_EQ(choose({"010"}, {heading}), "");
    // Lower-case codes never match upper-cased headings.
    EXPECT_EQ(choose({"1ce"}, {"T3872 OOPT=1CE"}), "");
    EXPECT_EQ(choose({"1CE"}, {"T3872 OOPT=1CE"}), "T3872 OOPT=1CE");
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

TEST_F(Selection, NoQualifyingHeadingNamesThePartials) {
    m_csv.SetSelection({"010"}, "T3872A");
    try {
        m_csv.SelectColumn("Preset Powers", {"T3999"});
        FAIL() << "selection without candidates";
    } catch (const std::string& text) {
        EXPECT_EQ(text, "Column was not found, Partials searched forT3999 and that's it!");
    }
    try {
        m_csv.FindSelection(*m_block, {"T3872", "AOPT"}, true, true);
        FAIL() << "unqualified option column chosen";
    } catch (const std::string& text) {
        EXPECT_EQ(text, "Column was not found, Partials searched forT3872 andAOPT and that's it!");
    }
    EXPECT_EQ(m_csv.FindSelection(*m_block, {"T3999"}, false, false), "");
    m_block->SetHeaderFlag(false);
    try {
        m_csv.FindSelection(*m_block, {"Nothing"}, false, true);
        FAIL() << "row selection without candidates";
    } catch (const std::string& text) {
        EXPECT_EQ(text, "Row was not found, Partials searched forNothing and that's it!");
    }
}

TEST_F(Selection, RowSelectionUsesFirstCells) {
    m_csv.SetSelection({"010"}, "T3872A");
    m_block->SetHeaderFlag(false);
    EXPECT_EQ(m_csv.FindSelection(*m_block, {"preset"}, false, true), "Preset Powers");
}

TEST(SplitText, DelimiterRunsCountAsOne) {
    std::vector<std::string> tokens{"stale"};
    EXPECT_EQ(Split("R1,,A", tokens, ",", '&'), 2);
    EXPECT_EQ(tokens, (std::vector<std::string>{"R1", "A"}));
    EXPECT_EQ(Split(",,", tokens, ",", '&'), 0);
    EXPECT_TRUE(tokens.empty());
    EXPECT_EQ(Split("", tokens, ",", '&'), 0);
    EXPECT_EQ(Split(" -30, 0", tokens, ",", '&'), 2);
    EXPECT_EQ(tokens, (std::vector<std::string>{" -30", " 0"}));
}

TEST(SplitText, GroupsKeepDelimiters) {
    std::vector<std::string> tokens;
    EXPECT_EQ(Split("R1,&R1 LOW, HIGH&,B", tokens, ",", '&'), 3);
    EXPECT_EQ(tokens, (std::vector<std::string>{"R1", "R1 LOW, HIGH", "B"}));
    // An unclosed group is dropped and scanning resumes after its opening character.
    EXPECT_EQ(Split("&open,b", tokens, ",", '&'), 2);
    EXPECT_EQ(tokens, (std::vector<std::string>{"open", "b"}));
    EXPECT_EQ(Split("a,&&,b", tokens, ",", '&'), 2);
    EXPECT_EQ(tokens, (std::vector<std::string>{"a", "b"}));
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
