#pragma once

// One simulated analyzer: a scenario, a state directory (its flash and its C: drive) and a
// clock. It hands out the measurement application's automation objects, registers itself
// as the "sim" analyzer back end, and keeps the transcript of all traffic.

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

#include "analyzer/automation/Automation.h"
#include "platform/Clock.h"
#include "scpi/Device.h"
#include "sim/Scenario.h"

namespace sim {

class Instrument;

class SimulatedAnalyzer {
  public:
    // Creates the state directory when needed. A fresh state directory receives the
    // scenario's stored characterizations; an existing one keeps what it holds. Without a
    // clock the instrument accounts its sweep time on a virtual clock.
    SimulatedAnalyzer(Scenario scenario, std::filesystem::path stateDirectory,
                      std::shared_ptr<platform::Clock> clock = nullptr);
    ~SimulatedAnalyzer();

    // A fresh Application object of the running application.
    std::shared_ptr<automation::Object> application();
    // The instrument as a network transport serves it.
    std::unique_ptr<scpi::Device> scpiDevice();
    // Registers this instrument under "sim" with the automation back-end factory (and as
    // its default); the factory keeps the instrument alive.
    void registerAsBackend();

    // The local folder that stands for the analyzer computer's C: drive.
    std::filesystem::path driveRoot() const;
    const Scenario& scenario() const;

    std::vector<std::string> transcript() const;
    void clearTranscript();
    // Also writes every later transcript line to the file.
    void setTraceFile(const std::filesystem::path& path);

    // What the restart program does: the application's volatile state returns to power-on
    // and automation objects handed out before become invalid; flash and files survive.
    void restartApplication();

    // The instrument itself, for the bench, the process runner and tests.
    Instrument& instrument() { return *m_instrument; }

  private:
    std::shared_ptr<Instrument> m_instrument;
};

// Registers the instrument as the "sim" back end; the free form of registerAsBackend().
void registerBackend(SimulatedAnalyzer& analyzer);

}  // namespace sim
