#include "frontends/qt/CharacterizationWindow.h"

#include <QComboBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QTabWidget>
#include <QVBoxLayout>
#include <QtCharts/QChartView>

#include "frontends/qt/CharacterizationChart.h"
#include "frontends/qt/ProgramIcon.h"

namespace qtui {

namespace {

// A chart view takes the new chart but only releases the previous one.
void replaceChart(QChartView& view, std::unique_ptr<QChart> chart) {
    std::unique_ptr<QChart> previous(view.chart());
    view.setChart(chart.release());
}

}  // namespace

CharacterizationWindow::CharacterizationWindow(QWidget* parent)
    : QWidget(parent, Qt::Window),
      m_receivers(new QComboBox(this)),
      m_tabs(new QTabWidget(this)),
      m_power(new QChartView(m_tabs)),
      m_phase(new QChartView(m_tabs)) {
    setWindowTitle("Receiver Characterization - Plots");
    setWindowIcon(programIcon());
    resize(900, 560);
    m_power->setRenderHint(QPainter::Antialiasing);
    m_phase->setRenderHint(QPainter::Antialiasing);
    m_tabs->addTab(m_power, "Compression power");
    m_tabs->addTab(m_phase, "Compression phase");

    auto* chooser = new QHBoxLayout;
    chooser->addWidget(new QLabel("Receiver:", this));
    chooser->addWidget(m_receivers);
    chooser->addStretch();
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(chooser);
    layout->addWidget(m_tabs);

    connect(m_receivers, &QComboBox::currentTextChanged, this,
            [this](const QString& receiver) { select(receiver); });
}

void CharacterizationWindow::showCharacterization(const std::string& receiver,
                                                  const CharacterizationData& data) {
    const QString name = QString::fromStdString(receiver);
    m_data[name] = data;
    if (m_receivers->findText(name) < 0) {
        m_receivers->addItem(name);
    }
    if (m_receivers->currentText() == name) {
        select(name);
    } else {
        m_receivers->setCurrentText(name);
    }
    show();
    raise();
}

QStringList CharacterizationWindow::receivers() const {
    QStringList names;
    for (int i = 0; i < m_receivers->count(); ++i) {
        names << m_receivers->itemText(i);
    }
    return names;
}

QString CharacterizationWindow::currentReceiver() const {
    return m_receivers->currentText();
}

void CharacterizationWindow::select(const QString& receiver) {
    auto it = m_data.find(receiver);
    if (it == m_data.end()) {
        return;
    }
    replaceChart(*m_power, makeCharacterizationChart(it->second, ChartView::CompressionPower));
    replaceChart(*m_phase, makeCharacterizationChart(it->second, ChartView::CompressionPhase));
}

}  // namespace qtui
