#include <gtest/gtest.h>

#include <QApplication>
#include <QImage>
#include <QtCharts/QCategoryAxis>
#include <QtCharts/QLineSeries>
#include <QtCharts/QValueAxis>
#include <regex>
#include <sstream>

#include "ErrorOf.h"
#include "QtTestApplication.h"
#include "TempDir.h"
#include "frontends/qt/CharacterizationChart.h"
#include "frontends/qt/PlotRenderer.h"
#include "storage/ExportText.h"

namespace {

using qtui::ChartView;
using testsupport::errorOf;
using testsupport::readFile;
using testsupport::writeFile;

// Receiver B: two low-frequency records, then band 1 GHz..2 GHz (5 points) and band
// 2 GHz..6 GHz (5 points) sharing their edge. Power at level k and f GHz: -10 + k + f;
// phase: 2k - f.
storage::RcvrCharImage knownImage() {
    auto image = storage::RcvrCharImage::withHeader("B", 12, 3.5f, 30.0f);
    image.appendZeroRecord(1e8);
    image.appendZeroRecord(5e8);
    auto addBand = [&image](double start, double stop) {
        for (int i = 0; i < 5; ++i) {
            const double f = start + i * (stop - start) / 4;
            storage::RecordPoints points;
            for (int k = 0; k < 4; ++k) {
                const float ghz = static_cast<float>(f / 1e9);
                points[static_cast<std::size_t>(k)] = {-10.0f + k + ghz, 0.05f - 0.1f * k,
                                                       2.0f * k - ghz};
            }
            image.appendRecord(f, points);
        }
    };
    addBand(1e9, 2e9);
    addBand(2e9, 6e9);
    return image;
}

std::string exportText() {
    std::ostringstream out;
    EXPECT_TRUE(storage::writeExportText(out, knownImage()));
    return out.str();
}

template <typename Axis>
Axis* axisOf(QChart& chart, Qt::Alignment alignment) {
    const auto axes = chart.axes(alignment == Qt::AlignLeft ? Qt::Vertical : Qt::Horizontal);
    for (auto* axis : axes) {
        if (axis->alignment() == alignment) {
            return qobject_cast<Axis*>(axis);
        }
    }
    return nullptr;
}

class CharacterizationPlot : public ::testing::Test {
  protected:
    void SetUp() override { qttest::qtApplication(); }
    testsupport::TempDir dir;
};

TEST_F(CharacterizationPlot, RecordsSplitIntoLowFrequenciesAndBandsWithTheirEdges) {
    const auto data = qtui::fromImage(knownImage());
    EXPECT_EQ(data.receiver, "B");
    EXPECT_FLOAT_EQ(data.narrowbandLoss, 3.5);
    EXPECT_FLOAT_EQ(data.attenuator, 30);
    ASSERT_EQ(data.records.size(), 12u);
    EXPECT_EQ(data.measuredRecords().size(), 10u);
    EXPECT_EQ(data.bandEdges(), (std::vector<double>{1e9, 2e9, 6e9}));

    // A gap between bands is marked at both of its ends.
    qtui::CharacterizationData gapped;
    for (double f : {1.0, 2.0, 3.0, 10.0, 15.0, 20.0}) {
        gapped.records.push_back({.frequency = f * 1e9});
        gapped.records.back().levels[0].power = -5;
    }
    EXPECT_EQ(gapped.bandEdges(), (std::vector<double>{1e9, 3e9, 10e9, 20e9}));
}

TEST_F(CharacterizationPlot, ChartsHaveOneSeriesPerLevelAndAxesSpanTheData) {
    struct Case {
        ChartView view;
        const char* what;
        QString yTitle;
        double first, last;  // level 0 at 1 GHz and 6 GHz; each level adds perLevel
        double perLevel;
        double yMin, yMax;  // the values' span and 5 % margin on either side
    };
    const auto data = qtui::fromImage(knownImage());
    for (const auto& c : {Case{ChartView::CompressionPower, "power", "Compression power (dBm)", -9,
                               -4, 1, -9.4, -0.6},
                          Case{ChartView::CompressionPhase, "phase", "Compression phase (deg)", -1,
                               -6, 2, -6.55, 5.55}}) {
        SCOPED_TRACE(c.what);
        auto chart = qtui::makeCharacterizationChart(data, c.view);
        const auto series = chart->series();
        ASSERT_EQ(series.size(), 4);
        const QStringList names{"0.05 dB", "0.1 dB", "0.2 dB", "0.5 dB"};
        for (int k = 0; k < 4; ++k) {
            auto* line = qobject_cast<QLineSeries*>(series[k]);
            ASSERT_NE(line, nullptr);
            EXPECT_EQ(line->name(), names[k]);
            ASSERT_EQ(line->count(), 10);
            EXPECT_DOUBLE_EQ(line->at(0).x(), 1.0);
            EXPECT_NEAR(line->at(0).y(), c.first + c.perLevel * k, 1e-5);
            EXPECT_NEAR(line->at(9).y(), c.last + c.perLevel * k, 1e-5);
        }
        auto* x = axisOf<QValueAxis>(*chart, Qt::AlignBottom);
        auto* y = axisOf<QValueAxis>(*chart, Qt::AlignLeft);
        ASSERT_NE(x, nullptr);
        ASSERT_NE(y, nullptr);
        EXPECT_EQ(x->titleText(), "Frequency (GHz)");
        EXPECT_DOUBLE_EQ(x->min(), 1.0);
        EXPECT_DOUBLE_EQ(x->max(), 6.0);
        EXPECT_EQ(y->titleText(), c.yTitle);
        EXPECT_NEAR(y->min(), c.yMin, 1e-4);
        EXPECT_NEAR(y->max(), c.yMax, 1e-4);
        auto* edges = axisOf<QCategoryAxis>(*chart, Qt::AlignTop);
        ASSERT_NE(edges, nullptr);
        EXPECT_EQ(edges->categoriesLabels(), (QStringList{"2 GHz", "6 GHz"}));
        EXPECT_DOUBLE_EQ(edges->startValue(), 1.0);
        EXPECT_EQ(chart->title(), QString("Receiver B: compression ") + c.what);
    }
}

TEST_F(CharacterizationPlot, DefaultedCharacterizationStillDrawsWithANote) {
    auto image = storage::RcvrCharImage::withHeader("A", 2, 0, 0);
    image.appendZeroRecord(1e9);
    image.appendZeroRecord(2e9);
    auto chart =
        qtui::makeCharacterizationChart(qtui::fromImage(image), ChartView::CompressionPower);
    EXPECT_EQ(chart->series().size(), 4);
    EXPECT_EQ(qobject_cast<QLineSeries*>(chart->series()[0])->count(), 0);
    EXPECT_EQ(chart->title(), "Receiver A: compression power (no compression data stored)");
}

TEST_F(CharacterizationPlot, ExportTextGivesTheSameChartDataAsTheImage) {
    const auto fromImage = qtui::fromImage(knownImage());
    // Also with Windows line ends, as the analyzer's own platform writes them.
    for (const auto& text :
         {exportText(), std::regex_replace(exportText(), std::regex("\n"), "\r\n")}) {
        const auto parsed = qtui::parseExportText(text);
        EXPECT_EQ(parsed.receiver, "B");
        EXPECT_FLOAT_EQ(parsed.narrowbandLoss, 3.5);
        ASSERT_EQ(parsed.records.size(), fromImage.records.size());
        for (std::size_t i = 0; i < parsed.records.size(); ++i) {
            EXPECT_DOUBLE_EQ(parsed.records[i].frequency, fromImage.records[i].frequency);
            EXPECT_EQ(parsed.records[i].levels, fromImage.records[i].levels);
        }
    }
}

TEST_F(CharacterizationPlot, MalformedInputIsReportedWithWhatWasWrong) {
    const std::string header = "1\nB\n25\n0\n30\n";
    const std::vector<std::pair<std::string, std::string>> cases = {
        {"1\nB\n25\n",
         "Export text has 3 header lines; expected 5 (version, receiver, 25, loss, attenuator)"},
        {"2\nB\n25\n0\n30\n", "Export text starts with \"2\"; expected 1"},
        {header + "1e9, (1,2,3), (1,2,3)", "Export text line 6: expected ',' at \"\""},
        {header + "1e9, (1,2,3), (1,2,3), (1,x,3), (1,2,3)",
         "Export text line 6: expected a number at \"x,3), (1,2,3)\""},
        {header + "1e9, (1,2,3), (1,2,3), (1,2,3), (1,2,3), (1,2,3)",
         "Export text line 6: more than 4 compression triples"},
    };
    for (const auto& [text, error] : cases) {
        EXPECT_EQ(errorOf([&] { qtui::parseExportText(text); }), error) << text;
    }
    auto truncated = knownImage().bytes();
    truncated.resize(truncated.size() - 10);
    EXPECT_EQ(errorOf([&] {
                  qtui::fromImage(storage::RcvrCharImage::fromBytes(truncated));
              }).rfind("Characterization image is not complete: ", 0),
              0u);
}

TEST_F(CharacterizationPlot, FilesOfEitherKindRenderToPngAndSvgOfTheAskedSize) {
    writeFile(dir / "RcvrCharTest.dat", knownImage().bytes());
    writeFile(dir / "RcvrChar_B_Exported.txt", exportText());

    const auto png = dir / "power.png";
    qtui::plotCharacterizationFile(dir / "RcvrCharTest.dat", png, ChartView::CompressionPower,
                                   QSize(800, 500));
    QImage image(QString::fromStdString(png.string()));
    ASSERT_FALSE(image.isNull());
    EXPECT_EQ(image.size(), QSize(800, 500));
    // Something besides the white background was drawn.
    int drawn = 0;
    for (int y = 0; y < image.height(); y += 5) {
        for (int x = 0; x < image.width(); x += 5) {
            drawn += image.pixel(x, y) != qRgb(255, 255, 255);
        }
    }
    EXPECT_GT(drawn, 0);

    const auto svg = dir / "phase.SVG";
    qtui::plotCharacterizationFile(dir / "RcvrChar_B_Exported.txt", svg,
                                   ChartView::CompressionPhase, qtui::kDefaultPlotSize);
    const std::string content = readFile(svg);
    EXPECT_NE(content.find("<svg"), std::string::npos);
    EXPECT_NE(content.find("viewBox=\"0 0 1000 600\""), std::string::npos);
    EXPECT_NE(content.find("Receiver B: compression phase"), std::string::npos);
}

TEST_F(CharacterizationPlot, UnusableArgumentsAreRefusedByName) {
    writeFile(dir / "empty.dat", "");
    writeFile(dir / "image.dat", knownImage().bytes());
    const auto plotError = [&](const std::string& input, const std::filesystem::path& output) {
        return errorOf([&] {
            qtui::plotCharacterizationFile(dir / input, output, ChartView::CompressionPower,
                                           QSize(10, 10));
        });
    };
    const auto png = dir / "x.png";
    EXPECT_EQ(plotError("missing.dat", png),
              "Cannot open characterization file " + (dir / "missing.dat").string());
    EXPECT_EQ(plotError("empty.dat", png),
              "Characterization file " + (dir / "empty.dat").string() + " is empty");
    EXPECT_EQ(plotError("image.dat", dir / "x.jpg"),
              "Plot output " + (dir / "x.jpg").string() +
                  " must end in .svg or .png to choose the format");
    EXPECT_EQ(plotError("image.dat", dir / "no" / "such" / "x.png"),
              "Cannot write plot file " + (dir / "no" / "such" / "x.png").string());
    EXPECT_EQ(errorOf([] { qtui::chartViewFromName("gain"); }),
              "Unknown chart view \"gain\"; use power or phase");
}

}  // namespace
