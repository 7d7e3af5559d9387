#pragma once

#include <map>
#include <string>
#include <vector>

#include "config/BandDefaults.h"
#include "config/Calibration.h"
#include "platform/Diagnostics.h"

class CCSVTable;

// Power range of a power sensor, dBm.
struct SensorRange {
    double m_min;
    double m_max;
};

// Everything a characterization needs from the configuration file for one analyzer model
// and option set. Filled once by ReadSequence (after SetModel and SetOptions), then only
// read; the engine moves the current band, current calibration and LFE mode during a run.
// Failures are thrown as std::string, except the two "No ... CNAData::GetSequence" texts,
// which are thrown as const char*.
class CNAData : public platform::iTalker {
  public:
    CNAData();
    ~CNAData() override;
    CNAData(const CNAData&) = delete;
    CNAData& operator=(const CNAData&) = delete;

    // Fills the main (lfe false) or LFE band map from a band block whose header flag is on.
    virtual void BuildBands(const CCSVTable& bandTable, bool lfe) = 0;
    // Reads the configuration file: ports, calibrations, sub-steps, constants, preset powers,
    // sensor ranges and bands.
    virtual void ReadSequence(const std::string& path);
    // Sum of the named calibrations' sub-step counts times (maxband - minband + 1).
    virtual int StepCount(const std::vector<std::string>& calibrationNames) const = 0;
    // Next band up to maxband; false (band unchanged) when already there.
    virtual bool NextBand() = 0;
    // Current band := minband; always true.
    virtual bool FirstBand() = 0;

    void SetModel(const std::string& model) { m_model = model; }
    const std::string& GetModel() const { return m_model; }
    void SetOptions(const std::vector<std::string>& options) { m_options = options; }
    const std::vector<std::string>& GetOptions() const { return m_options; }
    // The model's column key in the file's blocks (e.g. "T3872" for model "T3872A").
    const std::string& GetModelToken() const { return m_modelToken; }
    void SetLFEMode(bool lfe) { m_lfeMode = lfe; }
    bool GetLFEMode() const { return m_lfeMode; }

    // Names are case-insensitive. Throws "CNAData::GetConstant - Unknown Name (NAME)".
    double GetConstant(const std::string& name) const;
    bool HasConstant(const std::string& name) const;
    void SetConstant(const std::string& name, double value);
    // Upper-case name -> value.
    const std::map<std::string, double>& GetConstants() const { return m_constants; }

    // Band -1 is the current band. Throws "CNAData::GetBandDefaults - Unknown Band (n)".
    const BandDefaults& GetBandDefaults(int band = -1) const;
    // Throws "CNAData::GetLFEBandDefaults - Unknown Band (n)".
    const BandDefaults& GetLFEBandDefaults(int band = -1) const;
    const std::map<int, BandDefaults>& GetBands() const { return m_bandDefaults; }
    const std::map<int, BandDefaults>& GetLFEBands() const { return m_lfeBandDefaults; }
    int GetCurrentBand() const { return m_currentBand; }

    // Ports to characterize, in file order. Throws "No Port is selected to calibrate" when
    // there are none.
    const std::vector<std::string>& RequiredPorts() const;
    // Port name -> the receiver to characterize before that port's receivers, or "P".
    const std::map<std::string, std::string>& GetPortAssignments() const {
        return m_portAssignments;
    }
    // Names of the calibrations whose port (port text up to its first comma) equals one of
    // the ports exactly, in calibration order, once per matching port.
    std::vector<std::string> CalibrationsForPorts(const std::vector<std::string>& ports) const;
    // The calibration named exactly so; an empty name means the current calibration. Throws
    // "CNAData::Calibration - Unknown calibration (name)".
    const CCalibration& Calibration(const std::string& name = "") const;
    // Replaces the calibration of the same name, or appends it.
    void AddCalibration(const CCalibration& calibration);
    const std::vector<CCalibration>& GetCalibrations() const { return m_calibrations; }
    void SetCurrentCalibration(const std::string& name) { m_currentCalibration = name; }
    const std::string& GetCurrentCalibration() const { return m_currentCalibration; }

    // Stores the preset power of the current calibration.
    void SetPresetPower(float power) { m_presetPowers[m_currentCalibration] = power; }
    const std::map<std::string, float>& GetPresetPowers() const { return m_presetPowers; }
    const std::map<std::string, SensorRange>& GetSensorRanges() const { return m_sensorRanges; }

    // The calibration order: the dialog's receiver list when not empty.
    void GetOrder(std::vector<std::string>& order) const { order = m_calibrationOrder; }
    // Receivers that must be characterized before the given ports' receivers (in the
    // given order), and in portSearch whether a port search is needed at all.
    std::vector<std::string> Prerequisites(const std::vector<std::string>& receivers,
                                           bool& portSearch) const;

  protected:
    std::map<int, BandDefaults>& BandMap(bool lfe) {
        return lfe ? m_lfeBandDefaults : m_bandDefaults;
    }
    void SetCurrentBand(int band) { m_currentBand = band; }
    void SetOrder(std::vector<std::string> order) { m_calibrationOrder = std::move(order); }
    // The file ReadSequence is reading, for error texts.
    const std::string& GetSourcePath() const { return m_sourcePath; }

  private:
    bool m_lfeMode = false;
    std::vector<CCalibration> m_calibrations;
    std::vector<std::string> m_options{"None Set"};
    std::string m_model;
    std::string m_modelToken;
    std::map<int, BandDefaults> m_bandDefaults;
    std::map<int, BandDefaults> m_lfeBandDefaults;
    std::string m_currentCalibration = "None Set";
    int m_currentBand = -999;
    std::map<std::string, double> m_constants;
    std::map<std::string, float> m_presetPowers;
    std::vector<std::string> m_requiredPorts;
    std::map<std::string, std::string> m_portAssignments;
    std::map<std::string, SensorRange> m_sensorRanges;
    std::vector<std::string> m_calibrationOrder;
    std::string m_sourcePath;
};
