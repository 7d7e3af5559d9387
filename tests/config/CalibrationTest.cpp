#include <gtest/gtest.h>

#include "config/Calibration.h"

namespace {

CSub sub(const std::string& name, int position) {
    CSub s(name);
    s.SetPosition(position);
    return s;
}

std::vector<int> positions(const CCalibration& calibration) {
    std::vector<int> out;
    for (const auto& s : calibration.GetSubs()) {
        out.push_back(s.GetPosition());
    }
    return out;
}

TEST(CalibrationName, UpperCasedAndTrimmedOfBlanks) {
    EXPECT_EQ(CCalibration("  r1 low frequency extension ").GetName(),
              "R1 LOW FREQUENCY EXTENSION");
    EXPECT_EQ(CCalibration("   ").GetName(), "");
    CCalibration fresh("a");
    EXPECT_EQ(fresh.GetPort(), "");
    EXPECT_EQ(fresh.GetPathConfiguration(), "None Set");
    EXPECT_EQ(fresh.GetCopyFrom(), "None Set");
    EXPECT_EQ(fresh.GetVerification(), "None Set");
    CSub unset("x");
    EXPECT_EQ(unset.GetIFBW(), -999);
    EXPECT_EQ(unset.GetNumPoints(), -999);
    EXPECT_EQ(unset.GetTolerance(), -999.0F);
    EXPECT_EQ(unset.GetPosition(), -999);
}

TEST(CalibrationSubSteps, KeptInPositionOrderWithParallelNames) {
    CCalibration calibration("A");
    calibration.AddSub(sub("five", 5));
    calibration.AddSub(sub("two", 2));
    calibration.AddSub(sub("nine", 9));
    EXPECT_EQ(positions(calibration), (std::vector<int>{2, 5, 9}));
    EXPECT_EQ(calibration.GetSubNames(), (std::vector<std::string>{"two", "five", "nine"}));
    EXPECT_EQ(calibration.SubCount(), 3);
}

TEST(CalibrationSubSteps, SameNameReplacesOtherNameConflicts) {
    CCalibration calibration("A");
    calibration.AddSub(sub("five", 5));
    CSub again = sub("five", 5);
    again.SetIFBW(300);
    calibration.AddSub(again);
    ASSERT_EQ(calibration.SubCount(), 1);
    EXPECT_EQ(calibration.GetSubs()[0].GetIFBW(), 300);
    try {
        calibration.AddSub(sub("other", 5));
        FAIL() << "two sub-steps at one position";
    } catch (const std::string& text) {
        EXPECT_EQ(text, "CCalibration::AddSub Unable to add sub other position all ready Exists");
    }
    EXPECT_EQ(calibration.SubCount(), 1);
}

TEST(CalibrationSubSteps, OneSubStepAtTwoPositionsCountsTwice) {
    CCalibration calibration("A");
    calibration.AddSub(sub("ladder", 7));
    calibration.AddSub(sub("ladder", 3));
    EXPECT_EQ(positions(calibration), (std::vector<int>{3, 7}));
    EXPECT_EQ(calibration.SubCount(), 2);
}

}  // namespace
