#pragma once

// What result processing needs of one receiver's measured data: the measured frequencies,
// the narrowband findings, the acceptance limits and the compression-point search with its
// outputs. The engine's measured-data store provides it; result processing sits below the
// engine and knows only this view.

#include <string>
#include <vector>

namespace storage {

class MeasuredResults {
  public:
    virtual ~MeasuredResults() = default;

    virtual const std::vector<double>& getFrequencies() const = 0;
    virtual const std::vector<double>& getLowFrequencies() const = 0;
    virtual float getNarrowbandLoss() const = 0;
    virtual const std::string& getNarrowbandAtten() const = 0;
    virtual double getCalPowDelta() const = 0;
    virtual double getMaxMeasuredFrequency() const = 0;
    virtual float getMinCompStepRatio() const = 0;

    // Whether every reading at frequency index f, at every power level, is a finite number.
    virtual bool readingsFinite(int f) const = 0;
    // Searches the power levels at frequency index f for compression level L dB; the
    // outputs below hold what it found.
    virtual bool findCompressionPoint(float level, float tolerance, int f, bool first,
                                      int& startIndex, bool& stop) = 0;
    virtual float compressionPower() const = 0;
    virtual float compressionValue() const = 0;
    virtual float compressionPhase() const = 0;
    virtual void setCompressionValue(float value) = 0;
    virtual void setCompressionPhase(float phase) = 0;
    virtual void setCompressionPoint(float power, float value, float phase) = 0;
};

}  // namespace storage
