#include "SimRun.h"
#include "SentCommands.h"
#include "analyzer/automation/BackendFactory.h"
#include "analyzer/remote/RemoteApplication.h"

namespace enginetest {

void CollectingNotices::postnotice(const std::string& text) {
    lines.push_back(text);
    if (!trigger.empty() && text.find(trigger) != std::string::npos && onTrigger) {
        auto action = std::move(onTrigger);
        onTrigger = nullptr;
        action();
    }
}

SimRun::SimRun(const std::string& scenarioMembers, const std::string& model,
               const std::vector<std::string>& options,
               const std::function<void(std::string&)>& configEdit, bool overLan)
    : simulator(std::make_unique<sim::SimulatedAnalyzer>(
          sim::Scenario::fromJson("{" + scenarioMembers + "}"), dir / "analyzer")),
      paths(dir / "work"),
      log(paths) {
    std::filesystem::create_directories(workDir());
    paths.mapDrive('C', simulator->driveRoot());
    simulator->registerAsBackend();
    ui.answerAll(platform::Answer::Ok);
    ui.answer("Check Connection", {platform::Answer::No});
    ui.answer("Unexpected power ratio reading", {platform::Answer::No});
    std::string host;
    if (overLan) {
        device = simulator->scpiDevice();
        auto owned = std::make_unique<testsupport::DeviceTransport>(*device);
        transport = owned.get();
        link = std::make_shared<remote::ScpiLink>(std::move(owned), std::chrono::seconds(10));
        host = "lan-test";
        automation::BackendFactory::registerBackend(
            host, [link = link](const std::string&) { return remote::makeApplication(link); });
        // The operator's cabling reaches the instrument as a served simulator learns it.
        bench = std::make_unique<sim::SimulatedBench>(
            ui, sim::handsOverLink([link = link](const std::string& command) {
                link->command(command, "playing the bench");
            }));
    } else {
        bench = std::make_unique<sim::SimulatedBench>(ui, *simulator);
    }
    analyzer = std::make_unique<CNetworkAnalyzer>(host, *bench, clock);
    analyzer->readmodel(true);
    analyzer->readoptions(true);
    log.create();

    std::string text = testsupport::readFile(testsupport::sampleConfiguration());
    if (configEdit) {
        configEdit(text);
    }
    testsupport::writeFile(workDir() / "RcvrChar.dat", text);
    config.SetModel(model);
    config.SetOptions(options);
    config.ReadSequence((workDir() / "RcvrChar.dat").string());
    analyzer->preparecal();
    simulator->clearTranscript();
}

int SimRun::run(std::vector<std::string> receivers, const std::string& searchMode) {
    engine::RunContext context{
        *analyzer, config,  std::move(receivers), searchMode, findings, *bench,    clock,
        paths,     signals, noticeSink,           workDir(),  log,      connection};
    signals.workerRunning = true;
    return engine::runCharacterization(context);
}

std::vector<std::string> SimRun::notices() const {
    std::vector<std::string> result;
    for (const auto& line : noticeSink.lines) {
        result.push_back(line.size() >= 2 && line.ends_with("\r\n")
                             ? line.substr(0, line.size() - 2)
                             : line + "<no CR LF>");
    }
    return result;
}

std::vector<std::string> SimRun::commands() const {
    return testsupport::sentCommands(*simulator);
}

}  // namespace enginetest
