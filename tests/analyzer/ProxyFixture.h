#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "FakeAnalyzer.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Clock.h"
#include "platform/ErrorText.h"
#include "platform/ScriptedOperatorUi.h"

// Runs statement and returns the text of what it raised ("" when it raised nothing).
#define RAISED_TEXT(statement)                   \
    [&]() -> std::string {                       \
        try {                                    \
            statement;                           \
        } catch (...) {                          \
            return platform::currentErrorText(); \
        }                                        \
        return std::string();                    \
    }()

class ProxyTest : public ::testing::Test {
  protected:
    std::unique_ptr<CNetworkAnalyzer> connect() {
        return std::make_unique<CNetworkAnalyzer>("fake", ui, clock);
    }
    // A proxy after preparecal, with the log emptied.
    std::unique_ptr<CNetworkAnalyzer> prepared() {
        auto proxy = connect();
        proxy->preparecal();
        fake.log->clear();
        return proxy;
    }

    fakeanalyzer::FakeAnalyzer fake;
    fakeanalyzer::BackendRegistration registration{"fake", fake.application};
    platform::ScriptedOperatorUi ui;
    platform::VirtualClock clock;
};
