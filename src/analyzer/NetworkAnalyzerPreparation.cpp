// Bringing the analyzer into the start state of a characterization.

#include "analyzer/NetworkAnalyzerClass.h"

using automation::queryInterface;

namespace {

const char* const interfaceMismatch =
    "The 770x.tlb in use on the box does not match the file used during the build";

constexpr long startPoints = 21;
constexpr double startBandwidth = 1000;
constexpr double startPower = -30;

}  // namespace

void CNetworkAnalyzer::preparecal() {
    auto app = application();
    app->reset();
    app->preset(1);

    m_pChannelObject = app->activeChannel();
    m_pActiveChannel = queryInterface<automation::Channel>(m_pChannelObject);
    if (!m_pActiveChannel) {
        throw std::string(interfaceMismatch);
    }
    m_pSegmentTableObject = m_pActiveChannel->segmentTable();
    m_pSegmentTable = queryInterface<automation::SegmentTable>(m_pSegmentTableObject);
    if (!m_pSegmentTable) {
        throw std::string(interfaceMismatch);
    }

    readmodel(true);
    readoptions(true);
    readportcount(true);

    m_pCurrentMeasurementObject = app->currentMeasurement();
    m_pCurrentMeasurementData =
        queryInterface<automation::MeasurementData>(m_pCurrentMeasurementObject);

    setupchannel();
    if (m_numberOfPoints != startPoints) {
        m_pActiveChannel->setNumberOfPoints(startPoints);
        m_numberOfPoints = startPoints;
    }
    setifbandwidth(startBandwidth);
    setsweeptype("cw");
    setcwfrequency(0);
    setsourcepower(startPower, false);
    for (int port = 1; port <= m_portCount; ++port) {
        setattenuator("manual", port);
    }
    armtrigger();
    m_pActiveChannel->setContinuousSweep(true);
    eeupdatehw();
    pokelong();
}

void CNetworkAnalyzer::pokelong() {
    armtrigger();
    channel()->setContinuousSweep(true);
    sendscpi("diag:poke:long 9,3");
    eeupdatehw();
}
