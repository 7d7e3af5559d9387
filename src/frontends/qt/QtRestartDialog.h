#pragma once

#include <QDialog>

namespace qtui {

// The "Restart" notice, shown without blocking while the analyzer application restarts.
class QtRestartDialog : public QDialog {
    Q_OBJECT
  public:
    QtRestartDialog(const QString& title, const QString& text, QWidget* parent = nullptr);
};

}  // namespace qtui
