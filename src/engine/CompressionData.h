#pragma once

// One receiver's measured data: the band plan and its constants, the power ladder, every
// trace read at every power level, the narrowband findings, and the outputs of the last
// compression-point search. Used by the worker thread only.

#include <cstdint>
#include <filesystem>
#include <span>
#include <string>
#include <vector>

#include "platform/OperatorUi.h"
#include "storage/MeasuredResults.h"

class CNAData;

namespace engine {

class CCompressionData final : public storage::MeasuredResults {
  public:
    // Unknown trace types are reported to the operator through ui.
    explicit CCompressionData(platform::OperatorUi& ui);

    // Rebuilds the band plan from the configuration, measuring from minBand on.
    void loadTestParameters(CNAData& config, int minBand);
    void setPowerLevels(const std::vector<double>& ladder);

    // Files one trace read at power level `level` ("TestMag", "RatioMag" or "Phase").
    void putTrace(const std::string& type, std::span<const float> values, int level);
    void clearMeasurements();

    void setNarrowbandLoss(float loss) { m_narrowbandLoss = loss; }
    float getNarrowbandLoss() const override { return m_narrowbandLoss; }
    void setNarrowbandAtten(const std::string& atten) { m_narrowbandAtten = atten; }
    const std::string& getNarrowbandAtten() const override { return m_narrowbandAtten; }

    // Raw export of every trace to directory/"RcvrChar_AllMeasuredData_<tag>.csv", replacing
    // the earlier file only when complete. Raises an error text naming the file and the reason
    // when it cannot be written; the earlier file is then unchanged.
    void writeAllMeasuredData(const std::string& tag, const std::filesystem::path& directory) const;
    static std::string measuredDataFileName(const std::string& tag);

    bool readingsFinite(int f) const override;
    // Searches the power levels at frequency index f for compression level L dB.
    bool findCompressionPoint(float level, float tolerance, int f, bool first, int& startIndex,
                              bool& stop) override;
    float compressionPower() const override { return m_compressionPower; }
    float compressionValue() const override { return m_compressionValue; }
    float compressionPhase() const override { return m_compressionPhase; }
    void setCompressionValue(float value) override { m_compressionValue = value; }
    void setCompressionPhase(float phase) override { m_compressionPhase = phase; }
    void setCompressionPoint(float power, float value, float phase) override {
        m_compressionPower = power;
        m_compressionValue = value;
        m_compressionPhase = phase;
    }

    const std::vector<double>& getBandStarts() const { return m_bandStarts; }
    const std::vector<double>& getBandStops() const { return m_bandStops; }
    const std::vector<double>& getBandPoints() const { return m_bandPoints; }
    const std::vector<double>& getBandIfbws() const { return m_bandIfbws; }
    const std::vector<double>& getBandRefPowers() const { return m_bandRefPowers; }
    const std::vector<double>& getBandPowerLimits() const { return m_bandPowerLimits; }
    const std::vector<double>& getFrequencies() const override { return m_frequencies; }
    const std::vector<double>& getLowFrequencies() const override { return m_lowFrequencies; }
    const std::vector<double>& getPowerLevels() const { return m_powerLevels; }
    int getMinBand() const { return m_firstBand; }
    int getMaxBand() const { return m_lastBand; }
    double getCalPowDelta() const override { return m_calPowDelta; }
    double getSpamClipPower() const { return m_spamClipPower; }
    double getMaxMeasuredFrequency() const override { return m_maxMeasuredFrequency; }
    float getMinCompStepRatio() const override { return m_minCompStepRatio; }
    int getPowerCount() const { return static_cast<int>(m_powerLevels.size()); }
    bool isLfe() const { return m_lfe; }
    bool isT3951() const { return m_t3951; }
    bool hasOption210() const { return m_option210; }

    using Table = std::vector<std::vector<float>>;
    const Table& testMag() const { return m_testMag; }
    const Table& ratioMag() const { return m_ratioMag; }
    const Table& phase() const { return m_phase; }

    // Test and offline use: set the plan's constants without a configuration.
    struct Limits {
        double spamClipPower = 0;
        double calPowDelta = 0;
        float minCompStepRatio = 0;
        double maxMeasuredFrequency = 0;
        bool t3951 = false;
        bool option210 = false;
    };
    void setLimits(const Limits& limits);
    void setFrequencies(std::vector<double> measured, std::vector<double> low);

  private:
    platform::OperatorUi& m_ui;

    std::vector<double> m_bandStarts;
    std::vector<double> m_bandStops;
    std::vector<double> m_frequencies;
    Table m_testMag;
    Table m_ratioMag;
    Table m_phase;
    std::vector<double> m_bandPoints;
    std::vector<double> m_bandIfbws;
    std::vector<double> m_bandRefPowers;
    std::vector<double> m_bandPowerLimits;
    std::vector<double> m_powerLevels;
    std::vector<double> m_lowFrequencies;
    float m_narrowbandLoss = 0;
    float m_minCompStepRatio = 0;
    std::string m_narrowbandAtten;
    bool m_option210 = false;
    bool m_t3951 = false;
    bool m_lfe = false;
    std::int32_t m_firstBand = 0;
    std::int32_t m_lastBand = 0;
    double m_spamClipPower = 0;
    double m_calPowDelta = 0;
    double m_maxMeasuredFrequency = 0;
    float m_compressionPower = 0;
    float m_compressionValue = 0;
    float m_compressionPhase = 0;
};

// Wraps a phase into (-300, 300] around whole turns, as the search reports it.
float wrapPhase(float degrees);

}  // namespace engine
