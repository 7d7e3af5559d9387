#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "RunRcvrchar.h"

namespace {

using clitest::CommandRun;

CommandRun runConfigShow(const testsupport::TempDir& dir, const std::string& arguments) {
    return clitest::runRcvrchar(dir, "config show " + arguments);
}

using clitest::quotedSample;

TEST(ConfigShow, DefaultAnalyzerAsTheDialogSeesIt) {
    testsupport::TempDir dir;
    CommandRun run =
        runConfigShow(dir, "--file " + quotedSample() + " --model T3872A --options 010,080");
    ASSERT_EQ(run.status, 0) << run.err;
    EXPECT_EQ(run.err, "");
    auto json = nlohmann::ordered_json::parse(run.out);
    std::vector<std::string> keys;
    for (const auto& item : json.items()) {
        keys.push_back(item.key());
    }
    EXPECT_EQ(keys,
              (std::vector<std::string>{"model", "token", "options", "constants", "required_ports",
                                        "port_assignments", "calibrations", "bands", "lfe_bands",
                                        "order", "preset_powers", "sensor_ranges", "receivers",
                                        "prerequisites", "port_search"}));
    EXPECT_EQ(json["model"], "T3872A");
    EXPECT_EQ(json["token"], "T3872");
    EXPECT_EQ(json["options"], nlohmann::ordered_json({"010", "080"}));
    EXPECT_EQ(json["constants"]["MINBAND"], 2);
    EXPECT_EQ(json["port_assignments"]["Port 1"], "R1");
    EXPECT_EQ(json["receivers"],
              nlohmann::ordered_json({"R1", "R2", "R3", "R4", "A", "B", "C", "D"}));
    EXPECT_EQ(json["prerequisites"], nlohmann::ordered_json({"R1", "R2", "R3", "R4"}));
    EXPECT_EQ(json["port_search"], true);
    EXPECT_EQ(json["preset_powers"]["A"], -8);
    EXPECT_EQ(json["sensor_ranges"]["S1"]["min"], -60);
    const auto& a = json["calibrations"][4];
    EXPECT_EQ(a["name"], "A");
    EXPECT_EQ(a["port"], "Port 1,A/R1,\"RCVR A IN\"");
    EXPECT_EQ(a["verification"], "None Set");
    EXPECT_EQ(a["subs"][2]["name"], "Power Ladder");
    EXPECT_EQ(a["subs"][2]["position"], 3);
    EXPECT_EQ(a["subs"][2]["tolerance"], 0.05);  // printed from the float's shortest text
    EXPECT_EQ(
        json["bands"][0],
        nlohmann::ordered_json(
            {{"band", 0}, {"start", 1e7}, {"stop", 6e7}, {"points", 11}, {"power_limit", 10}}));
    EXPECT_EQ(json["lfe_bands"], nlohmann::ordered_json::array());
}

TEST(ConfigShow, FileDefaultsToWorkingDirectoryAndOptionsToNone) {
    testsupport::TempDir dir;
    testsupport::writeFile(dir / "RcvrChar.dat",
                           testsupport::readFile(testsupport::sampleConfiguration()));
    CommandRun run = runConfigShow(dir, "--model T3871B");
    ASSERT_EQ(run.status, 0) << run.err;
    auto json = nlohmann::json::parse(run.out);
    EXPECT_EQ(json["options"], nlohmann::json({"No Options"}));
    EXPECT_EQ(json["order"], nlohmann::json::array());
    EXPECT_EQ(json["receivers"], nlohmann::json({"R1", "R2", "A", "B"}));
    EXPECT_EQ(json["port_search"], false);
    EXPECT_EQ(json["bands"][1]["points"], 11);
    EXPECT_EQ(json["bands"][1]["power_limit"], 30);
}

TEST(ConfigShow, ErrorsGoToStderrAlone) {
    testsupport::TempDir dir;
    CommandRun missing = runConfigShow(dir, "--model T3872A");
    EXPECT_EQ(missing.status, 1);
    EXPECT_EQ(missing.out, "");
    EXPECT_EQ(missing.err, "CNAData::ReadSequence Can't open file RcvrChar.dat\n");

    CommandRun unknown = runConfigShow(dir, "--file " + quotedSample() + " --model T3999A");
    EXPECT_EQ(unknown.status, 1);
    EXPECT_EQ(unknown.out, "");
    EXPECT_EQ(unknown.err, "Table not found: T3999Ain CSV.\n");

    CommandRun noModel = runConfigShow(dir, "--file " + quotedSample());
    EXPECT_EQ(noModel.status, 1);
    EXPECT_EQ(noModel.out, "");
    EXPECT_EQ(noModel.err, "config show needs --model, e.g. --model T3872A\n");
}

}  // namespace
