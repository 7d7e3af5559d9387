#pragma once

// A simulated analyzer, its proxy and everything a storage operation needs, in a fresh
// temporary directory: the analyzer's C: drive and a working directory.

#include <memory>
#include <string>
#include <vector>

#include "TempDir.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Clock.h"
#include "platform/PathMap.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"
#include "storage/FlashCommandLog.h"
#include "storage/StorageContext.h"

namespace storagetest {

// A T3872B whose active configuration is the T3951A broadband system.
inline constexpr const char* kMillimetreWave =
    R"("idn": "Velquor Technologies,T3872B,MY00000001,A.13.55.06",
       "mmwave_catalog": "Default,T3951A Broadband", "mmwave_active": "T3951A Broadband")";

// The simulator's processes, with every command line recorded.
class RecordingProcesses : public platform::ProcessRunner {
  public:
    explicit RecordingProcesses(platform::ProcessRunner& runner) : m_runner(runner) {}
    int runProgram(const std::string& commandLine) override {
        commands.push_back(commandLine);
        return m_runner.runProgram(commandLine);
    }
    int runCommand(const std::string& command) override {
        commands.push_back(command);
        return m_runner.runCommand(command);
    }
    std::vector<std::string> commands;

  private:
    platform::ProcessRunner& m_runner;
};

class SimBench {
  public:
    // scenarioMembers: the members of the scenario's JSON object, without braces.
    explicit SimBench(const std::string& scenarioMembers = "");

    storage::StorageContext context() { return {*analyzer, ui, clock, paths, log}; }
    std::filesystem::path workDir() const { return dir / "work"; }
    // The local file of a Windows path on the analyzer's computer.
    std::filesystem::path local(const std::string& windowsPath) const {
        return paths.toLocal(windowsPath);
    }

    // SCPI commands sent since set-up, without the error-queue reads.
    std::vector<std::string> commands() const;
    // The lines of FlashCommands.txt, which must all end in CR LF.
    std::vector<std::string> logLines() const;

    testsupport::TempDir dir;
    std::unique_ptr<sim::SimulatedAnalyzer> simulator;
    platform::ScriptedOperatorUi ui;
    platform::VirtualClock clock;
    platform::DrivePathMap paths;
    storage::FlashCommandLog log;
    std::unique_ptr<CNetworkAnalyzer> analyzer;
    std::unique_ptr<sim::SimProcessRunner> simProcesses;
    std::unique_ptr<RecordingProcesses> processes;
};

}  // namespace storagetest
