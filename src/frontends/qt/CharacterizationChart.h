#pragma once

// Charts of one receiver's characterization: compression power or compression phase
// against frequency, one line per compression level, band edges as grid lines of a
// second frequency axis.

#include <QString>
#include <QtCharts/QChart>
#include <memory>

#include "frontends/qt/CharacterizationData.h"

namespace qtui {

enum class ChartView { CompressionPower, CompressionPhase };

// Parses "power" or "phase"; raises an error text for anything else.
ChartView chartViewFromName(const std::string& name);

// Series are named after their level ("0.05 dB", ...), in level order. The x axis is in
// GHz; the y axis spans the plotted values with a small margin.
std::unique_ptr<QChart> makeCharacterizationChart(const CharacterizationData& data, ChartView view);

QString levelSeriesName(double levelDb);

}  // namespace qtui
