#pragma once

// The bad-data dialog as a window: the prompt and the retest button are relabelled for the
// receiver; the retest button shows its "Please Note" box, owned by this dialog, before the
// dialog ends. Closing the window counts as "Don't retest".

#include <QDialog>

#include "app/RcvrCharBadDlg.h"
#include "platform/OperatorUi.h"

class QLabel;
class QPushButton;

namespace qtui {

class QtBadDataDialog : public QDialog {
    Q_OBJECT
  public:
    QtBadDataDialog(app::RcvrCharBadDlg& model, platform::OperatorUi& ui,
                    QWidget* parent = nullptr);

    platform::BadDataChoice choice() const { return m_model.choice(); }

  private:
    void press(platform::BadDataChoice button);

    app::RcvrCharBadDlg& m_model;
    platform::OperatorUi& m_ui;
};

}  // namespace qtui
