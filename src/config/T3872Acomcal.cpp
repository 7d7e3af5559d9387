#include "config/T3872Acomcal.h"

#include "config/ConfigurationFile.h"
#include "config/NumberText.h"
#include "config/Split.h"
#include "platform/NumberText.h"

namespace {

void Require(const CCSVTable& table, const std::string& name, const std::string& source,
             std::vector<std::string>& values) {
    if (!table.GetColumn(name, values)) {
        throw "Column \"" + name + "\" is missing from block \"" + table.GetName() + "\" in " +
            source;
    }
}

}  // namespace

void CT3872Acomcal::BuildBands(const CCSVTable& bandTable, bool lfe) {
    std::vector<std::string> calibrations = CalibrationsForPorts(RequiredPorts());
    std::map<int, BandDefaults>& bands = BandMap(lfe);
    bands.clear();
    std::vector<std::string> numbers, starts, stops, points, limits;
    Require(bandTable, "BandNum", GetSourcePath(), numbers);
    Require(bandTable, "Start_freq", GetSourcePath(), starts);
    Require(bandTable, "Stop_freq", GetSourcePath(), stops);
    bool hasPoints = bandTable.GetColumn("Points", points);
    bool hasLimits = bandTable.GetColumn("PowerLimit", limits);
    std::int32_t defaultPoints = 0;
    if (!hasPoints) {
        defaultPoints = TruncateToInt(GetConstant("pntsperband"), "pntsperband");
    }
    for (std::size_t row = 0; row < numbers.size(); ++row) {
        for (const auto& name : calibrations) {
            SetCurrentCalibration(name);
        }
        BandDefaults band;
        band.m_startFreq = platform::leadingDouble(starts[row]);
        band.m_stopFreq = platform::leadingDouble(stops[row]);
        band.m_points = hasPoints ? platform::leadingInteger(points[row]) : defaultPoints;
        if (hasLimits) {
            band.m_powerLimit = platform::leadingDouble(limits[row]);
        }
        // The engine spreads a band's points evenly from start to stop.
        if (band.m_points < 0 || band.m_points == 1) {
            throw "Band " + numbers[row] + " of block \"" + bandTable.GetName() + "\" has " +
                std::to_string(band.m_points) + " points in " + GetSourcePath() +
                "; a band needs 0 or at least 2";
        }
        bands[platform::leadingInteger(numbers[row])] = band;
    }
}

void CT3872Acomcal::ReadSequence(const std::string& path) {
    CNAData::ReadSequence(path);
    ConfigurationFile file(path, GetOptions(), GetModel(),
                           "CT3872Acomcal::ReadSequence Can't open file ");
    const CCSVTable* block = file.OptionalBlock("Order / Power");
    if (block == nullptr) {
        return;
    }
    auto selections = file.Column(*block, "Selection");
    auto values = file.SelectedColumn(*block, {file.Token()});
    for (std::size_t row = 0; row < selections.size(); ++row) {
        std::vector<std::string> parts;
        Split(values[row], parts, ",", '&');
        const std::string& selection = selections[row];
        if (selection.find("Power") != std::string::npos) {
            if (parts.size() < 2) {
                throw "The \"Order / Power\" row \"" + selection + "\" of model " + GetModel() +
                    " in " + path + " needs two powers, start and stop, but reads \"" +
                    values[row] + "\"";
            }
            SetConstant("teststartpower", platform::leadingDouble(parts[0]));
            SetConstant("teststoppower", platform::leadingDouble(parts[1]));
        } else if (selection.find("Order") != std::string::npos) {
            SetOrder(parts);
        } else if (selection.find("Minband") != std::string::npos) {
            if (parts.empty()) {
                throw "The \"Order / Power\" row \"" + selection + "\" of model " + GetModel() +
                    " in " + path + " needs a band number";
            }
            SetConstant("minband", platform::leadingDouble(parts[0]));
        }
    }
}

int CT3872Acomcal::StepCount(const std::vector<std::string>& calibrationNames) const {
    int subSteps = 0;
    for (const auto& name : calibrationNames) {
        subSteps += Calibration(name).SubCount();
    }
    int bands = TruncateToInt(GetConstant("maxband") - GetConstant("minband") + 1.0,
                              "maxband - minband + 1");
    return subSteps * bands;
}

bool CT3872Acomcal::FirstBand() {
    SetCurrentBand(TruncateToInt(GetConstant("minband"), "minband"));
    return true;
}

bool CT3872Acomcal::NextBand() {
    if (GetCurrentBand() < GetConstant("maxband")) {
        SetCurrentBand(GetCurrentBand() + 1);
        return true;
    }
    return false;
}
