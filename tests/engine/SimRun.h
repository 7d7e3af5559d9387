#pragma once

// A characterization run against a fresh simulated analyzer, with the sample configuration,
// a scripted operator whose cabling the simulated bench plays, and collected notices.

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "TempDir.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "config/T3872Acomcal.h"
#include "engine/CharacterizationRun.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/SimulatedAnalyzer.h"
#include "sim/SimulatedBench.h"
#include "storage/FlashCommandLog.h"

namespace enginetest {

struct CollectingNotices : platform::NoticeSink {
    std::vector<std::string> lines;
    // Runs once when a notice with this text arrives (e.g. to press Abort).
    std::string trigger;
    std::function<void()> onTrigger;
    void postnotice(const std::string& text) override;
};

class SimRun {
  public:
    // scenarioMembers: members of the scenario's JSON object, without braces.
    // configEdit: changes the sample configuration's text before it is read.
    explicit SimRun(const std::string& scenarioMembers = "", const std::string& model = "T3872A",
                    const std::vector<std::string>& options = {"010", "080"},
                    const std::function<void(std::string&)>& configEdit = nullptr);

    int run(std::vector<std::string> receivers, const std::string& searchMode = "Port-Search");

    std::vector<std::string> captions() const { return ui.captions(); }
    // Notices without their "\r\n".
    std::vector<std::string> notices() const;
    std::vector<std::string> commands() const;
    std::filesystem::path workDir() const { return dir / "work"; }

    testsupport::TempDir dir;
    std::unique_ptr<sim::SimulatedAnalyzer> simulator;
    platform::ScriptedOperatorUi ui;
    std::unique_ptr<sim::SimulatedBench> bench;
    platform::VirtualClock clock;
    platform::DrivePathMap paths;
    storage::FlashCommandLog log;
    platform::RunSignals signals;
    CollectingNotices noticeSink;
    storage::CatalogFindings findings;
    engine::RememberedConnection connection;
    CT3872Acomcal config;
    std::unique_ptr<CNetworkAnalyzer> analyzer;
};

}  // namespace enginetest
