#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "ErrorOf.h"
#include "FakeAnalyzer.h"
#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Clock.h"
#include "platform/ScriptedOperatorUi.h"

using testsupport::errorOf;

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
