#include "ConsoleRun.h"

#include <sstream>

#include "config/T3872Acomcal.h"
#include "frontends/console/ConsoleFrontEnd.h"
#include "sim/Scenario.h"
#include "sim/SimulatedBench.h"

namespace testsupport {

long sampleRecordCount() {
    CT3872Acomcal configuration;
    configuration.SetModel("T3872A");
    configuration.SetOptions({"010", "080"});
    configuration.ReadSequence(sampleConfiguration().string());
    long points = 0;
    for (int band = 0; band <= static_cast<int>(configuration.GetConstant("maxband")); ++band) {
        points += configuration.GetBandDefaults(band).m_points;
    }
    return points;
}

ConsoleRun::ConsoleRun(const std::string& scenario, bool withConfiguration)
    : m_previousDirectory(std::filesystem::current_path()),
      m_clock(std::make_shared<platform::VirtualClock>()) {
    if (withConfiguration) {
        std::filesystem::copy_file(sampleConfiguration(), m_dir / "RcvrChar.dat");
    }
    m_simulator = std::make_unique<sim::SimulatedAnalyzer>(sim::Scenario::fromJson(scenario),
                                                           m_dir / "analyzer-sim", m_clock);
    m_paths = std::make_unique<platform::DrivePathMap>(m_dir.path());
    m_paths->mapDrive('C', m_simulator->driveRoot());
    m_processes = std::make_unique<sim::SimProcessRunner>(*m_simulator, *m_paths);
    m_simulator->registerAsBackend();
    // The dialog reads "RcvrChar.dat" from the current directory.
    std::filesystem::current_path(m_dir.path());
}

ConsoleRun::~ConsoleRun() {
    std::filesystem::current_path(m_previousDirectory);
}

std::string ConsoleRun::defaultScenario() {
    return scenarioFile("default.json");
}

std::string ConsoleRun::scenarioFile(const std::string& name) {
    return readFile(std::filesystem::path(RCVRCHAR_SOURCE_DIR) / "data" / "scenarios" / name);
}

int ConsoleRun::run(const std::string& script, const std::string& answers) {
    return runWith(script, false, answers);
}

int ConsoleRun::runYes(const std::string& script) {
    return runWith(script, true, "");
}

int ConsoleRun::runInteractive(console::LineSource& keyboard, std::ostream& out) {
    console::ConsoleSetup setup = makeSetup();
    std::ostringstream err;
    const int status = console::runInteractive(setup, keyboard, out, err);
    m_err = err.str();
    return status;
}

console::ConsoleSetup ConsoleRun::makeSetup() {
    return {
        *m_clock,
        *m_paths,
        *m_processes,
        m_signals,
        m_dir.path(),
        [this](platform::OperatorUi& frontEnd) -> std::shared_ptr<platform::OperatorUi> {
            return std::make_shared<sim::SimulatedBench>(frontEnd, *m_simulator);
        },
        m_simulator->scenario().idn,
    };
}

int ConsoleRun::runWith(const std::string& script, bool yes, const std::string& answers) {
    console::ConsoleSetup setup = makeSetup();
    std::ostringstream out;
    std::ostringstream err;
    const int status = console::runScripted(
        setup, console::parseOperatorScript(script),
        yes ? console::AnswerBook::yesToAll() : console::AnswerBook::parse(answers), out, err);
    m_out = out.str();
    m_err = err.str();
    return status;
}

bool inOrder(const std::string& text, const std::vector<std::string>& expected) {
    std::size_t at = 0;
    for (const auto& part : expected) {
        at = text.find(part, at);
        if (at == std::string::npos) {
            return false;
        }
        at += part.size();
    }
    return true;
}

std::vector<std::string> ConsoleRun::transcriptMatching(const std::string& text) const {
    std::vector<std::string> lines;
    for (const auto& line : m_simulator->transcript()) {
        if (line.find(text) != std::string::npos) {
            lines.push_back(line);
        }
    }
    return lines;
}

}  // namespace testsupport
