#pragma once

// The plots beside the dialog: one entry per characterized receiver, with a view of the
// compression power and one of the compression phase.

#include <QWidget>
#include <map>
#include <string>

#include "frontends/qt/CharacterizationData.h"

class QComboBox;
class QTabWidget;
class QChartView;

namespace qtui {

class CharacterizationWindow : public QWidget {
    Q_OBJECT
  public:
    explicit CharacterizationWindow(QWidget* parent = nullptr);

    // Adds (or replaces) the receiver's characterization and shows it.
    void showCharacterization(const std::string& receiver, const CharacterizationData& data);

    QStringList receivers() const;
    QString currentReceiver() const;
    QChartView& powerView() const { return *m_power; }
    QChartView& phaseView() const { return *m_phase; }
    QTabWidget& tabs() const { return *m_tabs; }

  private:
    void select(const QString& receiver);

    QComboBox* m_receivers;
    QTabWidget* m_tabs;
    QChartView* m_power;
    QChartView* m_phase;
    std::map<QString, CharacterizationData> m_data;
};

}  // namespace qtui
