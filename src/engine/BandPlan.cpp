#include <string>

#include "config/NAData.h"
#include "engine/CompressionData.h"

namespace engine {

namespace {

const BandDefaults& bandRecord(const CNAData& config, bool lfe, int band) {
    return lfe ? config.GetLFEBandDefaults(band) : config.GetBandDefaults(band);
}

// A band's points: evenly spaced from start to stop; a one-point band is its start.
void appendBandPoints(std::vector<double>& out, const BandDefaults& band) {
    const int n = band.m_points;
    if (n <= 0) {
        return;
    }
    if (n == 1) {
        out.push_back(band.m_startFreq);
        return;
    }
    const double step = (band.m_stopFreq - band.m_startFreq) / (n - 1.0);
    for (int k = 0; k < n; ++k) {
        out.push_back(band.m_startFreq + k * step);
    }
}

}  // namespace

void CCompressionData::loadTestParameters(CNAData& config, int minBand) {
    m_firstBand = minBand;
    m_spamClipPower = config.GetConstant("SPAMClipPower");
    m_calPowDelta = config.GetConstant("CalPowDelta");
    m_minCompStepRatio = static_cast<float>(config.GetConstant("minCompStepRatio"));
    m_maxMeasuredFrequency = config.GetConstant("MaxMeasuredFrequency");

    m_option210 = false;
    for (const auto& option : config.GetOptions()) {
        if (option == "210" || option == "410") {
            m_option210 = true;
        }
    }

    m_lfe = config.GetLFEMode();
    int cutOffBand = 0;
    if (m_lfe) {
        cutOffBand = static_cast<int>(config.GetConstant("LFEtestifbwCutOffBand"));
    }

    m_bandStarts.clear();
    m_bandStops.clear();
    m_frequencies.clear();
    m_bandPoints.clear();
    m_bandIfbws.clear();
    m_bandRefPowers.clear();
    m_bandPowerLimits.clear();
    m_lowFrequencies.clear();

    int band = 0;
    while (band < minBand && bandRecord(config, m_lfe, band).m_points == 0) {
        ++band;
    }
    for (; band < minBand; ++band) {
        appendBandPoints(m_lowFrequencies, bandRecord(config, m_lfe, band));
    }

    m_lastBand = static_cast<int>(config.GetConstant(m_lfe ? "LFEmaxband" : "maxband"));
    m_t3951 = config.GetModel().find("T3951") != std::string::npos;

    for (int b = minBand; b <= m_lastBand; ++b) {
        const BandDefaults& record = bandRecord(config, m_lfe, b);
        if (m_t3951 && record.m_startFreq >= m_maxMeasuredFrequency) {
            m_lastBand = b - 1;
            break;
        }
        m_bandStarts.push_back(record.m_startFreq);
        m_bandStops.push_back(record.m_stopFreq);
        double ifbw;
        if (m_lfe) {
            ifbw = config.GetConstant(b > cutOffBand ? "LFEcutofftestifbw" : "LFEtestifbw");
        } else {
            ifbw = config.GetConstant("testifbw");
        }
        m_bandIfbws.push_back(ifbw);
        m_bandPoints.push_back(static_cast<double>(record.m_points));
        m_bandRefPowers.push_back(config.GetConstant("refpower"));
        m_bandPowerLimits.push_back(record.m_powerLimit);
        appendBandPoints(m_frequencies, record);
    }
}

}  // namespace engine
