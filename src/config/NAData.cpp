#include "config/NAData.h"

#include <algorithm>

#include "config/ConfigurationFile.h"
#include "config/NumberText.h"
#include "config/Split.h"
#include "config/TextMatch.h"
#include "platform/NumberText.h"

namespace {

// Calibrations with short names have their sub-step column headed "Rec-" + name.
std::string SubColumnKey(const std::string& calibrationName) {
    return calibrationName.size() <= 3 ? "Rec-" + calibrationName : calibrationName;
}

}  // namespace

CNAData::CNAData() {
    platform::CDiagnostic::RegisterTalker(this);
}

CNAData::~CNAData() = default;

double CNAData::GetConstant(const std::string& name) const {
    std::string key = ToUpper(name);
    auto found = m_constants.find(key);
    if (found == m_constants.end()) {
        throw "CNAData::GetConstant - Unknown Name (" + key + ")";
    }
    return found->second;
}

bool CNAData::HasConstant(const std::string& name) const {
    return m_constants.count(ToUpper(name)) > 0;
}

void CNAData::SetConstant(const std::string& name, double value) {
    m_constants[ToUpper(name)] = value;
}

const BandDefaults& CNAData::GetBandDefaults(int band) const {
    int number = band == -1 ? m_currentBand : band;
    auto found = m_bandDefaults.find(number);
    if (found == m_bandDefaults.end()) {
        throw "CNAData::GetBandDefaults - Unknown Band (" + std::to_string(number) + ")";
    }
    return found->second;
}

const BandDefaults& CNAData::GetLFEBandDefaults(int band) const {
    int number = band == -1 ? m_currentBand : band;
    auto found = m_lfeBandDefaults.find(number);
    if (found == m_lfeBandDefaults.end()) {
        throw "CNAData::GetLFEBandDefaults - Unknown Band (" + std::to_string(number) + ")";
    }
    return found->second;
}

const std::vector<std::string>& CNAData::RequiredPorts() const {
    if (m_requiredPorts.empty()) {
        throw std::string("No Port is selected to calibrate");
    }
    return m_requiredPorts;
}

std::vector<std::string> CNAData::CalibrationsForPorts(
    const std::vector<std::string>& ports) const {
    std::vector<std::string> names;
    for (const auto& calibration : m_calibrations) {
        const std::string& text = calibration.GetPort();
        std::string port = text.substr(0, text.find(','));
        for (const auto& wanted : ports) {
            if (port == wanted) {
                names.push_back(calibration.GetName());
            }
        }
    }
    return names;
}

const CCalibration& CNAData::Calibration(const std::string& name) const {
    const std::string& wanted = name.empty() ? m_currentCalibration : name;
    auto found = std::find_if(m_calibrations.begin(), m_calibrations.end(),
                              [&](const CCalibration& c) { return c.GetName() == wanted; });
    if (found == m_calibrations.end()) {
        throw "CNAData::Calibration - Unknown calibration (" + wanted + ")";
    }
    return *found;
}

void CNAData::AddCalibration(const CCalibration& calibration) {
    auto found =
        std::find_if(m_calibrations.begin(), m_calibrations.end(),
                     [&](const CCalibration& c) { return c.GetName() == calibration.GetName(); });
    if (found == m_calibrations.end()) {
        m_calibrations.push_back(calibration);
    } else {
        *found = calibration;
    }
}

std::vector<std::string> CNAData::Prerequisites(const std::vector<std::string>& receivers,
                                                bool& portSearch) const {
    portSearch = false;
    std::vector<std::string> first;
    for (const auto& receiver : receivers) {
        auto assigned = m_portAssignments.find(receiver);
        if (assigned == m_portAssignments.end()) {
            continue;
        }
        if (std::find(receivers.begin(), receivers.end(), assigned->second) != receivers.end()) {
            continue;
        }
        portSearch = true;
        if (assigned->second != "P") {
            first.push_back(assigned->second);
        }
    }
    return first;
}

void CNAData::ReadSequence(const std::string& path) {
    if (m_options.empty() || m_options.front() == "None Set") {
        throw "No Options set for CNAData::GetSequence";
    }
    if (m_model.empty() || m_model == "None Set") {
        throw "No Model Set in CNAData::GetSequence";
    }
    m_sourcePath = path;
    m_calibrations.clear();
    ConfigurationFile file(path, m_options, m_model, "CNAData::ReadSequence Can't open file ");
    const CCSVTable& modelTable = file.ModelTable();
    // The constant rule for the last row looks at the row before it.
    if (modelTable.RowCount() < 2) {
        throw "The table of model " + m_model + " in " + path +
            " needs at least two rows below the row naming the model";
    }
    const CCSVTable& portsBlock = file.RequiredBlock("Required Ports");
    const CCSVTable& calibrationsBlock = file.RequiredBlock("Calibrations / Port");
    const CCSVTable& subsBlock = file.RequiredBlock("Subs / Calibration");
    const CCSVTable& presetBlock = file.RequiredBlock("Preset Powers");
    const CCSVTable& bandBlock = file.RequiredBlock("Banded");
    const CCSVTable* lfeBandBlock = file.OptionalBlock("LFE Bands");
    const CCSVTable& sensorBlock = file.RequiredBlock("Power Range / Sensor");
    m_modelToken = file.Token();

    // Ports: "0" absent, "x" required, anything else required after that receiver.
    auto portNames = file.Column(portsBlock, "Port Names");
    auto portValues = file.SelectedColumn(portsBlock, {m_modelToken});
    m_requiredPorts.clear();
    m_portAssignments.clear();
    for (std::size_t i = 0; i < portNames.size(); ++i) {
        if (portValues[i] == "0") {
            continue;
        }
        m_requiredPorts.push_back(portNames[i]);
        if (portValues[i] != "x") {
            m_portAssignments[portNames[i]] = portValues[i];
        }
    }

    auto names = file.Column(calibrationsBlock, "Calibration Names");
    auto portTexts = file.SelectedColumn(calibrationsBlock, {m_modelToken});
    auto paths = file.SelectedColumn(calibrationsBlock, {"Path Configuration"});
    auto copyFrom = file.Column(calibrationsBlock, "Calibration to Copy From");
    std::vector<std::string> verifications;
    bool hasVerification = true;
    try {
        verifications = file.SelectedColumn(calibrationsBlock, {"Verification Name"});
    } catch (...) {
        hasVerification = false;
    }
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (portTexts[i] == "0") {
            continue;
        }
        CCalibration calibration(names[i]);
        calibration.SetPort(portTexts[i]);
        calibration.SetPathConfiguration(paths[i]);
        calibration.SetCopyFrom(copyFrom[i]);
        if (hasVerification && verifications[i] != "x") {
            calibration.SetVerification(verifications[i]);
        }
        AddCalibration(calibration);
    }

    auto subNames = file.Column(subsBlock, "Sub Names");
    auto ifbws = file.Column(subsBlock, "IFBW");
    auto points = file.Column(subsBlock, "NumPoints");
    auto tolerances = file.Column(subsBlock, "Tolerance");
    for (auto& calibration : m_calibrations) {
        auto cells = file.Column(subsBlock, SubColumnKey(calibration.GetName()));
        for (std::size_t row = 0; row < subNames.size(); ++row) {
            if (cells[row] == "0") {
                continue;
            }
            for (const auto& position : SplitAtCommas(cells[row])) {
                CSub sub(subNames[row]);
                sub.SetPosition(platform::leadingInteger(position));
                sub.SetIFBW(platform::leadingInteger(ifbws[row]));
                sub.SetNumPoints(platform::leadingInteger(points[row]));
                sub.SetTolerance(ToFloat(platform::leadingDouble(tolerances[row])));
                calibration.AddSub(sub);
            }
        }
    }

    // Constants are rows whose name is followed by another named row; walking upward lets
    // the uppermost of two equal names win.
    m_constants.clear();
    auto constantNames = file.Column(modelTable, m_model);
    std::vector<std::string> constantValues;
    modelTable.GetColumnValues(1, constantValues);
    for (std::size_t i = constantNames.size(); i-- > 0;) {
        bool last = i + 1 == constantNames.size();
        bool named = !constantNames[i].empty();
        bool qualifies =
            last ? named && !constantNames[i - 1].empty() : named && !constantNames[i + 1].empty();
        if (qualifies) {
            SetConstant(constantNames[i], platform::leadingDouble(constantValues[i]));
        }
    }

    auto presetNames = file.Column(presetBlock, "Calibration Names");
    auto presetValues = file.SelectedColumn(presetBlock, {m_modelToken});
    for (std::size_t i = 0; i < presetNames.size(); ++i) {
        if (presetValues[i] != "NA") {
            SetCurrentCalibration(presetNames[i]);
            SetPresetPower(ToFloat(platform::leadingDouble(presetValues[i])));
        }
    }

    m_sensorRanges.clear();
    auto sensors = file.Column(sensorBlock, "Sensor Names");
    auto maxPowers = file.Column(sensorBlock, "Max Power");
    auto minPowers = file.Column(sensorBlock, "Min Power");
    for (std::size_t i = 0; i < sensors.size(); ++i) {
        m_sensorRanges[sensors[i]] = {platform::leadingDouble(minPowers[i]),
                                      platform::leadingDouble(maxPowers[i])};
    }

    BuildBands(bandBlock, false);
    if (lfeBandBlock != nullptr) {
        BuildBands(*lfeBandBlock, true);
    }
}
