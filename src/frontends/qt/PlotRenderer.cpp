#include "frontends/qt/PlotRenderer.h"

#include <QApplication>
#include <QGraphicsLayout>
#include <QGraphicsScene>
#include <QImage>
#include <QPainter>
#include <QSvgGenerator>
#include <algorithm>
#include <cctype>
#include <system_error>

#include "platform/WholeFile.h"

namespace qtui {

namespace {

int g_argc = 1;
char g_programName[] = "rcvrchar";
char* g_argv[] = {g_programName, nullptr};

std::string lowerExtension(const std::filesystem::path& path) {
    std::string ext = path.extension().string();
    std::transform(ext.begin(), ext.end(), ext.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return ext;
}

void paintChart(QGraphicsScene& scene, QPainter& painter, QSize size) {
    painter.setRenderHint(QPainter::Antialiasing);
    scene.render(&painter, QRectF(QPointF(0, 0), size), QRectF(QPointF(0, 0), size));
}

}  // namespace

OffscreenApplicationScope::OffscreenApplicationScope() {
    if (QCoreApplication::instance() == nullptr) {
        qputenv("QT_QPA_PLATFORM", "offscreen");
        m_app = std::make_unique<QApplication>(g_argc, g_argv);
    }
}

OffscreenApplicationScope::~OffscreenApplicationScope() = default;

void renderChartToFile(QChart& chart, const std::filesystem::path& output, QSize size) {
    const std::string ext = lowerExtension(output);
    if (ext != ".svg" && ext != ".png") {
        throw std::string("Plot output " + output.string() +
                          " must end in .svg or .png to choose the format");
    }
    if (size.width() <= 0 || size.height() <= 0) {
        throw std::string("Plot size must be positive");
    }
    QGraphicsScene scene;
    scene.addItem(&chart);
    chart.setGeometry(QRectF(QPointF(0, 0), size));
    chart.layout()->activate();
    // Drawn beside the output and renamed over it, so that a failed plot leaves an earlier one.
    const auto partial = platform::WholeFile::partialPath(output);
    const QString fileName = QString::fromStdString(partial.string());
    bool written = false;
    if (ext == ".svg") {
        QSvgGenerator generator;
        generator.setFileName(fileName);
        generator.setSize(size);
        generator.setViewBox(QRect(QPoint(0, 0), size));
        generator.setTitle(chart.title());
        QPainter painter;
        if (painter.begin(&generator)) {
            paintChart(scene, painter, size);
            written = painter.end();
        }
    } else {
        QImage image(size, QImage::Format_ARGB32);
        image.fill(Qt::white);
        QPainter painter(&image);
        paintChart(scene, painter, size);
        painter.end();
        written = image.save(fileName, "PNG");
    }
    // The scene must not delete the chart, which belongs to the caller.
    scene.removeItem(&chart);
    std::error_code ec;
    if (written) {
        std::filesystem::rename(partial, output, ec);
    }
    if (!written || ec) {
        std::error_code ignored;
        std::filesystem::remove(partial, ignored);
        throw std::string("Cannot write plot file " + output.string() +
                          (ec ? ": " + ec.message() : std::string()));
    }
}

void plotCharacterizationFile(const std::filesystem::path& input,
                              const std::filesystem::path& output, ChartView view, QSize size) {
    const CharacterizationData data = loadCharacterization(input);
    auto chart = makeCharacterizationChart(data, view);
    renderChartToFile(*chart, output, size);
}

}  // namespace qtui
