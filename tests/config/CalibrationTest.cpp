#include <gtest/gtest.h>

#include "ConfigTestFiles.h"
#include "ErrorOf.h"
#include "config/Calibration.h"

namespace {

CSub sub(const std::string& name, int position) {
    CSub s(name);
    s.SetPosition(position);
    return s;
}

TEST(CalibrationName, UpperCasedAndTrimmedOfBlanks) {
    EXPECT_EQ(CCalibration("  r1 low frequency extension ").GetName(),
              "R1 LOW FREQUENCY EXTENSION");
    EXPECT_EQ(CCalibration("   ").GetName(), "");
}

TEST(CalibrationSubSteps, KeptInPositionOrderWithParallelNames) {
    CCalibration calibration("A");
    calibration.AddSub(sub("five", 5));
    calibration.AddSub(sub("two", 2));
    calibration.AddSub(sub("nine", 9));
    // One sub-step may stand at two positions; it counts twice.
    calibration.AddSub(sub("two", 7));
    EXPECT_EQ(configtest::positions(calibration), (std::vector<int>{2, 5, 7, 9}));
    EXPECT_EQ(calibration.GetSubNames(), (std::vector<std::string>{"two", "five", "two", "nine"}));
    EXPECT_EQ(calibration.SubCount(), 4);
}

TEST(CalibrationSubSteps, SameNameReplacesOtherNameConflicts) {
    CCalibration calibration("A");
    calibration.AddSub(sub("five", 5));
    CSub again = sub("five", 5);
    again.SetIFBW(300);
    calibration.AddSub(again);
    ASSERT_EQ(calibration.SubCount(), 1);
    EXPECT_EQ(calibration.GetSubs()[0].GetIFBW(), 300);
    EXPECT_EQ(testsupport::errorOf([&] { calibration.AddSub(sub("other", 5)); }),
              "CCalibration::AddSub Unable to add sub other position all ready Exists");
    EXPECT_EQ(calibration.SubCount(), 1);
}

}  // namespace
