#include "sim/SimulatedAnalyzer.h"

#include "analyzer/automation/BackendFactory.h"
#include "sim/AutomationObjects.h"
#include "sim/Instrument.h"
#include "sim/ScpiDevice.h"

namespace sim {

SimulatedAnalyzer::SimulatedAnalyzer(Scenario scenario, std::filesystem::path stateDirectory,
                                     std::shared_ptr<platform::Clock> clock)
    : m_instrument(std::make_shared<Instrument>(std::move(scenario), std::move(stateDirectory),
                                                std::move(clock))) {}

SimulatedAnalyzer::~SimulatedAnalyzer() = default;

std::shared_ptr<automation::Object> SimulatedAnalyzer::application() {
    return makeApplicationObject(m_instrument);
}

std::unique_ptr<scpi::Device> SimulatedAnalyzer::scpiDevice() {
    return makeScpiDevice(m_instrument);
}

void SimulatedAnalyzer::registerAsBackend() {
    std::shared_ptr<Instrument> instrument = m_instrument;
    automation::BackendFactory::registerBackend(
        "sim", [instrument](const std::string&) { return makeApplicationObject(instrument); });
    automation::BackendFactory::setDefaultBackend("sim");
}

void registerBackend(SimulatedAnalyzer& analyzer) {
    analyzer.registerAsBackend();
}

std::filesystem::path SimulatedAnalyzer::driveRoot() const {
    return m_instrument->driveRoot();
}

const Scenario& SimulatedAnalyzer::scenario() const {
    return m_instrument->scenario();
}

std::vector<std::string> SimulatedAnalyzer::transcript() const {
    return m_instrument->transcript().lines();
}

void SimulatedAnalyzer::clearTranscript() {
    m_instrument->transcript().clear();
}

void SimulatedAnalyzer::setTraceFile(const std::filesystem::path& path) {
    m_instrument->transcript().setFile(path);
}

void SimulatedAnalyzer::restartApplication() {
    m_instrument->restartApplication();
}

}  // namespace sim
