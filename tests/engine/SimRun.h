#pragma once

// A characterization run against a fresh simulated analyzer, with the sample configuration,
// a scripted operator whose cabling the simulated bench plays, and collected notices.

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "DeviceTransport.h"
#include "TempDir.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "analyzer/remote/ScpiLink.h"
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
    // overLan: the proxy reaches the simulator through the LAN back end, over an in-memory
    // link onto the simulator's SCPI device.
    explicit SimRun(const std::string& scenarioMembers = "", const std::string& model = "T3872A",
                    const std::vector<std::string>& options = {"010", "080"},
                    const std::function<void(std::string&)>& configEdit = nullptr,
                    bool overLan = false);

    int run(std::vector<std::string> receivers, const std::string& searchMode = "Port-Search");

    std::vector<std::string> captions() const { return ui.captions(); }
    // Notices without their "\r\n".
    std::vector<std::string> notices() const;
    std::vector<std::string> commands() const;
    std::filesystem::path workDir() const { return dir / "work"; }

    testsupport::TempDir dir;
    std::unique_ptr<sim::SimulatedAnalyzer> simulator;
    std::unique_ptr<scpi::Device> device;
    // Set when the run goes over the LAN back end.
    testsupport::DeviceTransport* transport = nullptr;
    std::shared_ptr<remote::ScpiLink> link;
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
