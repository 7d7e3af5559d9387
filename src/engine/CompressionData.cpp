#include "engine/CompressionData.h"

#include <algorithm>
#include <cmath>

namespace engine {

CCompressionData::CCompressionData(platform::OperatorUi& ui) : m_ui(ui) {}

void CCompressionData::setPowerLevels(const std::vector<double>& ladder) {
    m_powerLevels = ladder;
}

void CCompressionData::putTrace(const std::string& type, std::span<const float> values, int level) {
    if (level < 0 || level > getPowerCount()) {
        throw std::string("Bad trace number passed to putTrace");
    }
    Table* table = nullptr;
    if (type == "TestMag") {
        table = &m_testMag;
    } else if (type == "RatioMag") {
        table = &m_ratioMag;
    } else if (type == "Phase") {
        table = &m_phase;
    } else {
        m_ui.messageBox({"Unknown Trace Type in CCompressionData::putTrace", "ERROR",
                         platform::Buttons::Ok, platform::BoxSystemModal | platform::BoxTopmost});
        return;
    }
    if (table->size() < static_cast<std::size_t>(level) + 1) {
        table->emplace_back(values.begin(), values.end());
    } else {
        auto& row = (*table)[level];
        row.insert(row.end(), values.begin(), values.end());
    }
}

void CCompressionData::clearMeasurements() {
    m_testMag.clear();
    m_ratioMag.clear();
    m_phase.clear();
}

void CCompressionData::setLimits(const Limits& limits) {
    m_spamClipPower = limits.spamClipPower;
    m_calPowDelta = limits.calPowDelta;
    m_minCompStepRatio = limits.minCompStepRatio;
    m_maxMeasuredFrequency = limits.maxMeasuredFrequency;
    m_t3951 = limits.t3951;
    m_option210 = limits.option210;
}

void CCompressionData::setFrequencies(std::vector<double> measured, std::vector<double> low) {
    m_frequencies = std::move(measured);
    m_lowFrequencies = std::move(low);
}

float wrapPhase(float degrees) {
    long long turns = static_cast<long long>(degrees) / 360;
    float x = degrees - static_cast<float>(360 * turns);
    if (x > 300) {
        x -= 360;
    }
    if (x < -300) {
        x += 360;
    }
    return x;
}

bool CCompressionData::readingsFinite(int f) const {
    const auto column = static_cast<std::size_t>(f);
    for (const Table* table : {&m_testMag, &m_ratioMag, &m_phase}) {
        for (const auto& level : *table) {
            if (column < level.size() && !std::isfinite(level[column])) {
                return false;
            }
        }
    }
    return true;
}

bool CCompressionData::findCompressionPoint(float level, float tolerance, int f, bool first,
                                            int& startIndex, bool& stop) {
    const float L = level;
    const float tol = tolerance;
    const double clip = m_spamClipPower;
    const double delta = m_calPowDelta;

    m_compressionValue = 0;
    m_compressionPhase = 0;
    stop = false;

    // Levels whose rows do not reach this frequency cannot be read; they count as absent.
    const std::size_t column = static_cast<std::size_t>(f);
    const int N = getPowerCount();
    int rows = static_cast<int>(std::min({m_ratioMag.size(), m_testMag.size(), m_phase.size()}));
    rows = std::min(rows, N);
    auto readable = [&](int i) {
        return f >= 0 && column < m_testMag[i].size() && column < m_ratioMag[i].size() &&
               column < m_phase[i].size();
    };
    auto usable = [&](int i) {
        return i < rows && readable(i) && m_testMag[i][column] < clip && m_ratioMag[i][column] < 0;
    };
    auto setStopBelowClip = [&](double power) {
        if (clip - power < delta) {
            stop = true;
        }
    };

    float m = 0;
    int best = -1;
    float rPrev = 0;
    const bool upward = !first;
    int i;
    float tPrev;
    if (first) {
        i = N - 1;
        tPrev = 99.0f;
    } else {
        i = std::clamp(startIndex, 0, std::max(N - 1, 0));
        tPrev = -99.0f;
    }

    while (upward ? i < rows : i >= 0) {
        if (usable(i)) {
            const float t = m_testMag[i][column];
            const float r = m_ratioMag[i][column];
            startIndex = i;
            m_compressionPower = t;
            m_compressionValue = r;
            m_compressionPhase = wrapPhase(m_phase[i][column]);
            if (r < m) {
                m = r;
                best = i;
            }
            if (upward) {
                if (m_t3951 && t - tPrev < -0.2) {
                    return false;
                }
                if (r <= -(L - tol)) {
                    setStopBelowClip(t);
                    return true;
                }
            } else if (r >= -(L + tol) && (!m_t3951 || tPrev - t >= -0.2)) {
                setStopBelowClip(t);
                if (i != best || r <= -(L - tol)) {
                    return true;
                }
                if (L == 0.05f && m_option210) {
                    if (r <= -0.2 * L) {
                        return true;
                    }
                    if (std::fabs(m_compressionPhase) >= 2 * L) {
                        m_compressionValue = 0.00001f;
                        return true;
                    }
                }
                return false;
            }
            tPrev = t;
            rPrev = r;
            if (!upward && r >= -L) {
                break;
            }
        }
        i += upward ? 1 : -1;
    }

    if (rPrev <= -(L - tol)) {
        setStopBelowClip(m_compressionPower);
        return true;
    }
    if (upward && rPrev > m) {
        m_compressionPower = m_testMag[best][column];
        m_compressionValue = m;
        m_compressionPhase = wrapPhase(m_phase[best][column]);
        startIndex = best - 1;
    } else if (m_compressionValue == 0 && rows > 0 && readable(rows - 1)) {
        m_compressionPower = m_testMag[rows - 1][column];
        if (m_compressionPower > clip) {
            m_compressionPower = static_cast<float>(clip);
        }
    }
    setStopBelowClip(m_compressionPower);
    return false;
}

}  // namespace engine
