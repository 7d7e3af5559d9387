#pragma once

#include <QDialog>

#include "app/CAboutDlg.h"

namespace qtui {

// "About Receiver Characterization": the icon, the product version and the ownership line.
class QtAboutDialog : public QDialog {
    Q_OBJECT
  public:
    // about must have been initialised (its version text replaces the template text).
    explicit QtAboutDialog(const app::CAboutDlg& about, QWidget* parent = nullptr);
};

}  // namespace qtui
