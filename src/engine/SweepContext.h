#pragma once

// What the connection checks and the sweeps of one receiver work with. Every member is
// owned elsewhere and outlives the run.

#include "engine/RememberedConnection.h"
#include "platform/Clock.h"
#include "platform/OperatorUi.h"
#include "platform/RunSignals.h"

class CNetworkAnalyzer;
class CNAData;

namespace engine {

class CCompressionData;

struct SweepContext {
    CNetworkAnalyzer& proxy;
    CNAData& config;
    CCompressionData& store;
    platform::OperatorUi& ui;
    platform::Clock& clock;
    platform::RunSignals& signals;
    platform::NoticeSink& notices;
    RememberedConnection& connection;

    // Ends the worker when the operator asked to abort.
    void checkabort() { platform::checkabort(signals, notices); }
};

}  // namespace engine
