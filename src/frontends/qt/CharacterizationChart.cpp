#include "frontends/qt/CharacterizationChart.h"

#include <QPen>
#include <QtCharts/QCategoryAxis>
#include <QtCharts/QLineSeries>
#include <QtCharts/QValueAxis>
#include <algorithm>
#include <limits>

namespace qtui {

namespace {

constexpr double kHzPerGHz = 1e9;

double plotted(const storage::CompressionPoint& point, ChartView view) {
    return view == ChartView::CompressionPower ? point.power : point.phase;
}

QString frequencyLabel(double hz) {
    if (hz >= kHzPerGHz) {
        return QString::number(hz / kHzPerGHz, 'g', 6) + " GHz";
    }
    return QString::number(hz / 1e6, 'g', 6) + " MHz";
}

}  // namespace

ChartView chartViewFromName(const std::string& name) {
    if (name == "power") {
        return ChartView::CompressionPower;
    }
    if (name == "phase") {
        return ChartView::CompressionPhase;
    }
    throw std::string("Unknown chart view \"" + name + "\"; use power or phase");
}

QString levelSeriesName(double levelDb) {
    return QString::number(levelDb) + " dB";
}

std::unique_ptr<QChart> makeCharacterizationChart(const CharacterizationData& data,
                                                  ChartView view) {
    auto chart = std::make_unique<QChart>();
    const auto measured = data.measuredRecords();
    const bool power = view == ChartView::CompressionPower;
    QString title = QString("Receiver %1: compression %2")
                        .arg(QString::fromStdString(data.receiver), power ? "power" : "phase");
    if (measured.empty()) {
        title += " (no compression data stored)";
    }
    chart->setTitle(title);

    double xMin = 0, xMax = 1, yMin = 0, yMax = 1;
    if (!measured.empty()) {
        xMin = measured.front()->frequency / kHzPerGHz;
        xMax = measured.back()->frequency / kHzPerGHz;
        yMin = std::numeric_limits<double>::max();
        yMax = std::numeric_limits<double>::lowest();
    }
    for (std::size_t level = 0; level < kLevelCount; ++level) {
        auto* series = new QLineSeries(chart.get());
        series->setName(levelSeriesName(kCompressionLevelsDb[level]));
        QList<QPointF> points;
        points.reserve(static_cast<qsizetype>(measured.size()));
        for (const auto* record : measured) {
            const double y = plotted(record->levels[level], view);
            const double x = record->frequency / kHzPerGHz;
            points.append(QPointF(x, y));
            yMin = std::min(yMin, y);
            yMax = std::max(yMax, y);
            xMin = std::min(xMin, x);
            xMax = std::max(xMax, x);
        }
        series->replace(points);
        chart->addSeries(series);
    }
    if (xMax <= xMin) {
        xMax = xMin + 1;
    }
    const double margin = yMax > yMin ? 0.05 * (yMax - yMin) : 1.0;
    yMin -= margin;
    yMax += margin;

    auto* xAxis = new QValueAxis(chart.get());
    xAxis->setTitleText("Frequency (GHz)");
    xAxis->setRange(xMin, xMax);
    auto* yAxis = new QValueAxis(chart.get());
    yAxis->setTitleText(power ? "Compression power (dBm)" : "Compression phase (deg)");
    yAxis->setRange(yMin, yMax);
    chart->addAxis(xAxis, Qt::AlignBottom);
    chart->addAxis(yAxis, Qt::AlignLeft);

    // Band edges: a category axis whose boundaries are the edges draws one grid line each.
    auto* edgeAxis = new QCategoryAxis(chart.get());
    edgeAxis->setTitleText("Measured band edges");
    edgeAxis->setLabelsPosition(QCategoryAxis::AxisLabelsPositionOnValue);
    edgeAxis->setRange(xMin, xMax);
    edgeAxis->setStartValue(xMin);
    QPen edgePen(QColor(160, 40, 40));
    edgePen.setStyle(Qt::DashLine);
    edgeAxis->setGridLinePen(edgePen);
    for (double edge : data.bandEdges()) {
        const double x = edge / kHzPerGHz;
        // The first edge is the axis start; a category needs an end above its start.
        if (x > xMin) {
            edgeAxis->append(frequencyLabel(edge), x);
        }
    }
    chart->addAxis(edgeAxis, Qt::AlignTop);

    for (auto* series : chart->series()) {
        series->attachAxis(xAxis);
        series->attachAxis(yAxis);
    }
    if (!chart->series().isEmpty()) {
        chart->series().front()->attachAxis(edgeAxis);
    }
    chart->legend()->setAlignment(Qt::AlignBottom);
    return chart;
}

}  // namespace qtui
