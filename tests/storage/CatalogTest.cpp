#include <gtest/gtest.h>

#include <ctime>
#include <sstream>

#include "SimBench.h"
#include "storage/CatalogAge.h"
#include "storage/FlashCatalog.h"

using namespace std::chrono;
using storage::catalogAge;
using storage::CatalogFindings;

namespace {

// A moment given in local wall-clock time (the tests run in Europe/Kyiv).
system_clock::time_point localTime(int year, int month, int day, int hour, int minute,
                                   int second = 0) {
    std::tm tm{};
    tm.tm_year = year - 1900;
    tm.tm_mon = month - 1;
    tm.tm_mday = day;
    tm.tm_hour = hour;
    tm.tm_min = minute;
    tm.tm_sec = second;
    tm.tm_isdst = -1;
    return system_clock::from_time_t(std::mktime(&tm));
}

const std::vector<std::string> kReceivers = {"R1", "R2", "A", "B", "R1 LOW FREQUENCY EXTENSION"};

}  // namespace

TEST(CatalogAge, SevenWholeDaysCountFromNoonOfTheDateInLocalWallClock) {
    auto beforeNoon = localTime(2026, 3, 10, 11, 59, 59);
    auto atNoon = localTime(2026, 3, 10, 12, 0, 0);
    EXPECT_EQ(catalogAge("3/10/2026", beforeNoon), 1);
    EXPECT_EQ(catalogAge("3/2/2026", beforeNoon), 1);  // 7 days 23 hours
    EXPECT_EQ(catalogAge("3/2/2026", atNoon), -1);     // 8 days
    EXPECT_EQ(catalogAge("3/3/2026", localTime(2026, 3, 10, 23, 59, 59)), 1);
    EXPECT_EQ(catalogAge("03/02/2026", atNoon), -1);
    EXPECT_EQ(catalogAge("12/4/2025", atNoon), -1);
    EXPECT_EQ(catalogAge("3/20/2026", atNoon), 1);  // in the future
    // Half a second before noon rounds to noon: 8 whole days.
    EXPECT_EQ(catalogAge("3/2/2026", atNoon - milliseconds(500)), -1);
    EXPECT_EQ(catalogAge("3/2/2026", atNoon - milliseconds(501)), 1);
    // Summer time starts on 29 March 2026 in Kyiv; eight calendar days at noon are still
    // eight days although only 191 hours passed.
    EXPECT_EQ(catalogAge("3/25/2026", localTime(2026, 4, 2, 12, 0, 0)), -1);
    EXPECT_EQ(catalogAge("3/25/2026", localTime(2026, 4, 2, 11, 59, 59)), 1);
}

TEST(CatalogAge, UnreadableDatesAreUndetermined) {
    auto now = localTime(2026, 3, 10, 12, 0);
    // "13/1": no month above 12; "3/345": the day is read from two characters.
    for (const char* date :
         {"12/0/2026", "13/1/2026", "0/5/2026", "2/30/2026", "3/345/2026", "3/10", "Volume", ""}) {
        EXPECT_EQ(catalogAge(date, now), 0) << date;
    }
}

TEST(CatalogReply, FindsReceiversByCalibrationNameAndAgeAndEmptyRepliesChangeNothing) {
    auto now = localTime(2026, 3, 10, 9, 30);
    CatalogFindings findings{
        {"R1", 0}, {"R2", 0}, {"A", 2}, {"B", 0}, {"R1 LOW FREQUENCY EXTENSION", 0}};
    storage::applyCatalogReply(
        "03/10/2026 08:00:00 5622 RCVRCHAR\\R1_LFE\n"  // R1 and R1_LFE match; the later wins
        "02/01/2026 08:00:00 5622 RCVRCHAR\\R2\n"
        "03/09/2026 08:00:00 5622 RCVRCHAR\\R2\r\n"  // later lines overwrite
        "12/0/2026 08:00:00 5622 RCVRCHAR\\A\n"      // unreadable date: unchanged
        "03/10/2026 08:00:00 5622 RcvrChar\\B\n"     // other capitalisation: ignored
        "03/10/2026 5622 RCVRCHAR\\B\n"              // three fields: no characterization
        "03/10/2026 08:00:00 5622 OTHER\\B\n",
        kReceivers, findings, now);
    EXPECT_EQ(findings,
              (CatalogFindings{
                  {"R1", 0}, {"R2", 1}, {"A", 2}, {"B", 0}, {"R1 LOW FREQUENCY EXTENSION", 1}}));
    CatalogFindings untouched{{"B", 3}};
    storage::applyCatalogReply("", kReceivers, untouched, now);
    storage::applyCatalogReply("\n\n  \n", kReceivers, untouched, now);
    EXPECT_EQ(untouched, (CatalogFindings{{"B", 3}}));
}

TEST(CatalogListing, ReadsDateFirstAndSizeFourthOfTheFilesLine) {
    auto now = localTime(2026, 3, 10, 9, 0);
    auto state = [&](const std::string& listing, const std::string& file = "RcvrCharRef.dat") {
        std::istringstream in(listing);
        return storage::listingState(in, file, now);
    };
    std::string head =
        " Volume in drive C has no label.\r\n Volume Serial Number is 1C2D-3E4F\r\n\r\n"
        " Directory of C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\T3951A "
        "Broadband\\Port 1\\Factory Cal Data\r\n\r\n";
    EXPECT_EQ(state(head + "03/09/2026  10:15 AM              5622 RcvrCharRef.dat\r\n"), 1);
    EXPECT_EQ(state(head + "02/09/2026  10:15 AM              5622 RcvrCharRef.dat\r\n"), -1);
    EXPECT_EQ(state(head + "03/09/2026  10:15 AM                 0 RcvrCharRef.dat\r\n"), 0);
    EXPECT_EQ(state(head + "File Not Found\r\n"), 0);
    EXPECT_EQ(state(head + "03/09/2026  10:15 AM  5622 RcvrCharTest.dat\r\n"), 0);
    EXPECT_EQ(state(head + "03/09/2026  10:15 AM  5622 RcvrCharTest.dat\r\n", "RcvrCharTest.dat"),
              1);
    // Reading stops at an overlong line, even when the file's line follows it.
    EXPECT_EQ(state(std::string(150, 'x') + "\r\n03/09/2026 10:15 AM 5622 RcvrCharRef.dat\r\n"), 0);
    EXPECT_EQ(state(std::string(149, 'x') + "\r\n03/09/2026 10:15 AM 5622 RcvrCharRef.dat\r\n"), 1);
    EXPECT_EQ(state(""), 0);
}

TEST(CatalogFlash, ReadsTheSimulatorsFlashCatalog) {
    storagetest::SimBench bench(R"("stored": [
        {"receiver": "R1", "age_days": 1, "records": 3},
        {"receiver": "R2", "age_days": 30, "records": 3},
        {"receiver": "B", "age_days": 2, "records": 3}])");
    CatalogFindings findings{{"B", 2}};
    storage::catalogFlash(bench.context(), *bench.processes, kReceivers, findings);
    EXPECT_EQ(findings,
              (CatalogFindings{
                  {"R1", 1}, {"R2", -1}, {"A", 0}, {"B", 1}, {"R1 LOW FREQUENCY EXTENSION", 0}}));
    EXPECT_EQ(bench.commands(), std::vector<std::string>{"DIAG:FLASH:CAT?"});
    EXPECT_TRUE(bench.processes->commands.empty());  // a flash analyzer starts no processes
}

namespace {

const std::string kPortFolder =
    "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\T3951A Broadband\\Port ";

void dateFile(const std::filesystem::path& file, system_clock::time_point when) {
    std::filesystem::last_write_time(file, std::chrono::file_clock::from_sys(when));
}

}  // namespace

TEST(CatalogFlash, MillimetreWaveListsEachDataFileAndReadsDateAndSize) {
    storagetest::SimBench bench(std::string(storagetest::kMillimetreWave) + R"(, "stored": [
        {"receiver": "R1", "age_days": 0, "records": 100},
        {"receiver": "R2", "age_days": 0, "records": 3},
        {"receiver": "A", "age_days": 0, "records": 3},
        {"receiver": "B", "age_days": 0, "records": 3}])");
    auto path = [&](int port, const char* file) {
        return bench.local(kPortFolder + std::to_string(port) + "\\Factory Cal Data\\" + file);
    };
    ASSERT_EQ(std::filesystem::file_size(path(1, "RcvrCharRef.dat")), 5622u);
    dateFile(path(1, "RcvrCharRef.dat"), localTime(2026, 3, 9, 16, 45));  // yesterday
    dateFile(path(2, "RcvrCharRef.dat"), localTime(2026, 3, 3, 8, 0));    // 7 days
    dateFile(path(1, "RcvrCharTest.dat"), localTime(2026, 3, 2, 23, 0));  // 8 days
    testsupport::writeFile(path(2, "RcvrCharTest.dat"), "");              // size 0
    std::vector<std::string> receivers = {
        "R1", "R2", "R3", "A", "B", "C", "R1 LOW FREQUENCY EXTENSION"};

    CatalogFindings morning{{"C", 3}};
    storage::catalogFlash(bench.context(), *bench.processes, receivers, morning,
                          localTime(2026, 3, 10, 11, 59));
    EXPECT_EQ(morning, (CatalogFindings{{"R1", 1},
                                        {"R2", 1},
                                        {"R3", 0},
                                        {"A", 1},
                                        {"B", 0},
                                        {"C", 3},
                                        {"R1 LOW FREQUENCY EXTENSION", 1}}));
    ASSERT_EQ(bench.processes->commands.size(), receivers.size());
    EXPECT_EQ(bench.processes->commands[0],
              "dir /-C \"" + kPortFolder + "1\\Factory Cal Data\\RcvrCharRef.dat\" > fileInfo.txt");
    EXPECT_EQ(
        bench.processes->commands[4],
        "dir /-C \"" + kPortFolder + "2\\Factory Cal Data\\RcvrCharTest.dat\" > fileInfo.txt");
    EXPECT_EQ(bench.processes->commands[6], bench.processes->commands[0]);
    // The last listing stays in the working directory.
    EXPECT_NE(testsupport::readFile(bench.workDir() / "fileInfo.txt").find("RcvrCharRef.dat"),
              std::string::npos);
    EXPECT_TRUE(bench.commands().empty());

    CatalogFindings afternoon;
    storage::catalogFlash(bench.context(), *bench.processes, {"A"}, afternoon,
                          localTime(2026, 3, 10, 12, 0));
    EXPECT_EQ(afternoon, (CatalogFindings{{"A", -1}}));
}
