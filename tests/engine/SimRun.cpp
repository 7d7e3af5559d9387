#include "SimRun.h"
#include "SentCommands.h"

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
               const std::function<void(std::string&)>& configEdit)
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
    bench = std::make_unique<sim::SimulatedBench>(ui, *simulator);
    analyzer = std::make_unique<CNetworkAnalyzer>("", *bench, clock);
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
