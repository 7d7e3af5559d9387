#pragma once

// Draws a characterization chart into an SVG or PNG file without a display.

#include <QSize>
#include <QtCharts/QChart>
#include <filesystem>
#include <memory>

#include "frontends/qt/CharacterizationChart.h"

class QApplication;

namespace qtui {

// Makes sure a QApplication exists for the lifetime of the scope. When none exists it
// creates one on the offscreen platform, so charts render on machines without a display.
class OffscreenApplicationScope {
  public:
    OffscreenApplicationScope();
    ~OffscreenApplicationScope();
    OffscreenApplicationScope(const OffscreenApplicationScope&) = delete;
    OffscreenApplicationScope& operator=(const OffscreenApplicationScope&) = delete;

  private:
    std::unique_ptr<QApplication> m_app;
};

inline constexpr QSize kDefaultPlotSize{1000, 600};

// The file name's extension (.svg or .png, any case) chooses the format; raises an error
// text for any other extension or when the file cannot be written.
void renderChartToFile(QChart& chart, const std::filesystem::path& output, QSize size);

// Loads the characterization file and renders the chosen view into output.
void plotCharacterizationFile(const std::filesystem::path& input,
                              const std::filesystem::path& output, ChartView view, QSize size);

}  // namespace qtui
