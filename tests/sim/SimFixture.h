#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "TempDir.h"
#include "analyzer/automation/Automation.h"
#include "sim/SimulatedAnalyzer.h"

namespace simtest {

// The lines of a reply or listing, without their line breaks.
inline std::vector<std::string> splitLines(const std::string& text) {
    std::vector<std::string> lines;
    for (std::size_t start = 0; start < text.size();) {
        std::size_t end = text.find('\n', start);
        lines.push_back(text.substr(start, end - start));
        start = end == std::string::npos ? text.size() : end + 1;
    }
    return lines;
}

// One simulated analyzer in a fresh state directory, with its parser at hand.
class SimFixture : public ::testing::Test {
  protected:
    void start(const std::string& scenarioJson = "{}") {
        m_analyzer = std::make_unique<sim::SimulatedAnalyzer>(sim::Scenario::fromJson(scenarioJson),
                                                              m_state.path());
        connect();
    }
    // A new application object and parser, as a fresh proxy gets them.
    void connect() {
        m_app = automation::queryInterface<automation::Application>(m_analyzer->application());
        ASSERT_TRUE(m_app);
        m_parser = automation::queryInterface<automation::ScpiParser>(m_app->scpiParser());
        ASSERT_TRUE(m_parser);
    }
    std::string scpi(const std::string& command) { return m_parser->parse(command); }
    std::string nextError() { return scpi("SYST:ERR?"); }
    std::shared_ptr<automation::Channel> channel() {
        return automation::queryInterface<automation::Channel>(m_app->activeChannel());
    }
    // The named measurement's trace in the format code, as the proxy reads it.
    std::vector<float> read(const std::string& name, int format = 1) {
        auto collection =
            automation::queryInterface<automation::MeasurementCollection>(m_app->measurements());
        for (int i = 1; i <= collection->count(); ++i) {
            auto object = collection->item(i);
            if (automation::queryInterface<automation::Measurement>(object)->name() == name) {
                auto data = automation::queryInterface<automation::MeasurementData>(object);
                long points = channel()->numberOfPoints();
                std::vector<float> values(static_cast<std::size_t>(points));
                EXPECT_EQ(0, data->readData(2, format, points, values));
                values.resize(static_cast<std::size_t>(points));
                return values;
            }
        }
        ADD_FAILURE() << "no measurement " << name;
        return {};
    }

    testsupport::TempDir m_state;
    std::unique_ptr<sim::SimulatedAnalyzer> m_analyzer;
    std::shared_ptr<automation::Application> m_app;
    std::shared_ptr<automation::ScpiParser> m_parser;
};

}  // namespace simtest
