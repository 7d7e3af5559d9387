#include <gtest/gtest.h>

#include "ErrorOf.h"
#include "TempDir.h"
#include "sim/Scenario.h"

namespace {

std::string errorOf(const std::string& json) {
    return testsupport::errorOf([&] { sim::Scenario::fromJson(json); });
}

TEST(Scenario, EmptyObjectIsAFourPortAnalyzerWithoutOptions) {
    auto s = sim::Scenario::fromJson("{}");
    EXPECT_EQ("", s.options);
    EXPECT_EQ((std::vector<std::string>{"R1", "R2", "R3", "R4", "A", "B", "C", "D"}),
              s.receiverNames());
    // Reference receivers sit behind 20 dB pads, so they saturate 20 dB lower.
    EXPECT_DOUBLE_EQ(s.receiver("A").psatDbm - 20.0, s.receiver("R1").psatDbm);
}

// Stored images and every fault are read by the flash and bench tests, which use them.
TEST(Scenario, ReadsPortCountAppDirAndReceiverDefaultsFieldByField) {
    auto s = sim::Scenario::fromJson(R"({"port_count": 2, "app_dir": "D:\\NA",
        "receivers": {"*": {"psat_dbm": 10.0, "smoothness": 2.0, "am_pm_deg_per_db": 1.5,
                            "psat_slope_db_per_ghz": -0.1, "psat_ripple_db": 0.3},
                      "R1": {"psat_dbm": -12.0, "psat_ripple_period_ghz": 2.5},
                      "A": {"psat_ripple_db": 0, "psat_ripple_period_ghz": 0}}})");
    EXPECT_EQ((std::vector<std::string>{"R1", "R2", "A", "B"}), s.receiverNames());
    EXPECT_EQ("D:\\NA", s.appDir);
    EXPECT_DOUBLE_EQ(-12.0, s.receiver("R1").psatDbm);
    EXPECT_DOUBLE_EQ(2.0, s.receiver("R1").smoothness);
    EXPECT_DOUBLE_EQ(1.5, s.receiver("R1").amPmDegPerDb);
    EXPECT_DOUBLE_EQ(10.0, s.receiver("B").psatDbm);
    EXPECT_DOUBLE_EQ(-0.1, s.receiver("R1").psatSlopeDbPerGhz);
    EXPECT_DOUBLE_EQ(0.3, s.receiver("R1").psatRippleDb);
    EXPECT_DOUBLE_EQ(2.5, s.receiver("R1").psatRipplePeriodGhz);
    EXPECT_DOUBLE_EQ(5.0, s.receiver("B").psatRipplePeriodGhz);
    EXPECT_DOUBLE_EQ(0.0, s.receiver("A").psatRippleDb);
    auto flat = sim::Scenario::fromJson("{}");
    EXPECT_DOUBLE_EQ(0.0, flat.receiver("C").psatSlopeDbPerGhz);
    EXPECT_DOUBLE_EQ(0.0, flat.receiver("C").psatRippleDb);
}

TEST(Scenario, ErrorsNameTheKeyAndTheProblem) {
    EXPECT_EQ("scenario: unknown key \"colour\"", errorOf(R"({"colour": 1})"));
    EXPECT_EQ("scenario: \"port_count\" must be 1 to 4, not 6", errorOf(R"({"port_count": 6})"));
    EXPECT_EQ("scenario: \"options\" must be a string, not an array",
              errorOf(R"({"options": ["010"]})"));
    EXPECT_EQ("scenario: \"receivers.R1.psat_dbm\" must be a number, not a string",
              errorOf(R"({"receivers": {"R1": {"psat_dbm": "high"}}})"));
    EXPECT_EQ("scenario: unknown key \"gain\" in receivers.*",
              errorOf(R"({"receivers": {"*": {"gain": 1}}})"));
    EXPECT_EQ(
        "scenario: \"receivers.R3\" names receiver \"R3\", which a 2-port analyzer does "
        "not have",
        errorOf(R"({"port_count": 2, "receivers": {"R3": {}}})"));
    EXPECT_EQ(
        "scenario: \"faults.disconnected.E\" names receiver \"E\", which a 4-port "
        "analyzer does not have",
        errorOf(R"({"faults": {"disconnected": {"E": 1}}})"));
    EXPECT_EQ("scenario: unknown key \"slow\" in faults", errorOf(R"({"faults": {"slow": {}}})"));
    EXPECT_EQ("scenario: \"faults.bad_data.B\" must be an integer, not a number",
              errorOf(R"({"faults": {"bad_data": {"B": 1.5}}})"));
    EXPECT_EQ("scenario: \"stored[0]\" needs exactly one of \"records\" and \"words\"",
              errorOf(R"({"stored": [{"receiver": "A"}]})"));
    EXPECT_EQ(
        "scenario: \"faults.scpi_errors[0].errors[0]\" must read code,\"message\", not "
        "\"oops\"",
        errorOf(R"({"faults": {"scpi_errors": [{"command": "x", "errors": ["oops"]}]}})"));
    EXPECT_EQ("scenario: \"idn\" must read maker,model,serial,firmware, not \"T3872A\"",
              errorOf(R"({"idn": "T3872A"})"));
    EXPECT_EQ("scenario: \"receivers.A.smoothness\" must be greater than 0",
              errorOf(R"({"receivers": {"A": {"smoothness": 0}}})"));
    EXPECT_EQ("scenario: \"receivers.*.psat_slope_db_per_ghz\" must be a number, not a string",
              errorOf(R"({"receivers": {"*": {"psat_slope_db_per_ghz": "steep"}}})"));
    // The period is checked once "*" and the receiver's own fields are merged.
    EXPECT_EQ(
        "scenario: \"receivers.B.psat_ripple_period_ghz\" must be greater than 0 while "
        "\"psat_ripple_db\" is not 0",
        errorOf(
            R"({"receivers": {"*": {"psat_ripple_period_ghz": 0}, "B": {"psat_ripple_db": 1}}})"));
    EXPECT_EQ(
        "scenario: \"receivers.*.psat_ripple_period_ghz\" must be greater than 0 while "
        "\"psat_ripple_db\" is not 0",
        errorOf(R"({"receivers": {"*": {"psat_ripple_db": 0.3, "psat_ripple_period_ghz": -5}}})"));
    EXPECT_EQ(0u, errorOf("{").rfind("scenario: invalid JSON: ", 0));
}

TEST(Scenario, FilesAreReadAndNamedInErrors) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "s.json", R"({"options": "010"})");
    EXPECT_EQ("010", sim::Scenario::fromFile(dir / "s.json").options);
    testsupport::writeFile(dir / "bad.json", R"({"port_count": true})");
    EXPECT_EQ("scenario: \"port_count\" must be an integer, not a boolean (" +
                  (dir / "bad.json").string() + ")",
              testsupport::errorOf([&] { sim::Scenario::fromFile(dir / "bad.json"); }));
    EXPECT_THROW(sim::Scenario::fromFile(dir / "missing.json"), std::string);
}

TEST(Scenario, ShippedScenarioFilesAreValid) {
    auto folder = std::filesystem::path(RCVRCHAR_SOURCE_DIR) / "data" / "scenarios";
    int count = 0;
    for (const auto& file : std::filesystem::directory_iterator(folder)) {
        SCOPED_TRACE(file.path().string());
        EXPECT_NO_THROW(sim::Scenario::fromFile(file.path()));
        ++count;
    }
    EXPECT_GE(count, 4);
    EXPECT_EQ("010,080", sim::Scenario::fromFile(folder / "default.json").options);
}

// Link faults: a count or a count with times; one prefix rule or an array of them.
TEST(Scenario, ReadsLinkFaultsAndNamesWhatIsWrong) {
    const auto s = sim::Scenario::fromJson(R"({"faults": {"link": {
        "drop_after_commands": 7, "restart_after_commands": {"commands": 5, "times": 2},
        "stall_on": {"command": "calc:data?"},
        "garbage_on": [{"command": "*OPC?", "times": 3}, {"command": "MMEM:CAT?"}],
        "drop_mid_response_on": [], "split_reply_ms": 40}}})");
    const auto& link = s.faults.link;
    ASSERT_TRUE(link.dropAfterCommands && link.restartAfterCommands);
    EXPECT_EQ(link.dropAfterCommands->commands, 7);
    EXPECT_EQ(link.dropAfterCommands->times, 1);
    EXPECT_EQ(link.restartAfterCommands->commands, 5);
    EXPECT_EQ(link.restartAfterCommands->times, 2);
    ASSERT_EQ(link.stallOn.size(), 1u);
    EXPECT_EQ(link.stallOn[0].command, "calc:data?");
    ASSERT_EQ(link.garbageOn.size(), 2u);
    EXPECT_EQ(link.garbageOn[0].times, 3);
    EXPECT_EQ(link.garbageOn[1].command, "MMEM:CAT?");
    EXPECT_TRUE(link.dropMidResponseOn.empty());
    EXPECT_EQ(link.splitReplyMs, 40);

    EXPECT_EQ("scenario: unknown key \"flaky\" in faults.link",
              errorOf(R"({"faults": {"link": {"flaky": 1}}})"));
    EXPECT_EQ("scenario: \"faults.link.drop_after_commands\" must count at least 1 command",
              errorOf(R"({"faults": {"link": {"drop_after_commands": 0}}})"));
    EXPECT_EQ(
        "scenario: \"faults.link.restart_after_commands\" must be an integer or an object, not "
        "a string",
        errorOf(R"({"faults": {"link": {"restart_after_commands": "5"}}})"));
    EXPECT_EQ("scenario: \"faults.link.stall_on[1]\" needs \"command\"",
              errorOf(R"({"faults": {"link": {"stall_on": [{"command": "A"}, {"times": 1}]}}})"));
    EXPECT_EQ("scenario: \"faults.link.garbage_on.command\" must not be empty",
              errorOf(R"({"faults": {"link": {"garbage_on": {"command": " "}}}})"));
    EXPECT_EQ(
        "scenario: \"faults.link.stall_on.times\" must be a count from 0 to 2147483647, "
        "not -1",
        errorOf(R"({"faults": {"link": {"stall_on": {"command": "A", "times": -1}}}})"));
    EXPECT_EQ("scenario: \"faults.link.split_reply_ms\" must be at most 60000, not 90000",
              errorOf(R"({"faults": {"link": {"split_reply_ms": 90000}}})"));
    EXPECT_EQ(
        "scenario: \"faults.link.drop_mid_response_on\" must be an object or an array, "
        "not an integer",
        errorOf(R"({"faults": {"link": {"drop_mid_response_on": 3}}})"));
}

}  // namespace
