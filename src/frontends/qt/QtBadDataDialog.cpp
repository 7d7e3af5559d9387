#include "frontends/qt/QtBadDataDialog.h"

#include <QLabel>
#include <QPushButton>

#include "frontends/qt/BoxOwnerScope.h"
#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/Palette.h"
#include "frontends/qt/ProgramIcon.h"

namespace qtui {

QtBadDataDialog::QtBadDataDialog(app::RcvrCharBadDlg& model, platform::OperatorUi& ui,
                                 QWidget* parent)
    : QDialog(parent), m_model(model), m_ui(ui) {
    setWindowTitle(app::RcvrCharBadDlg::kTitle);
    setWindowIcon(programIcon());
    applyDialogBackground(*this);
    const DialogUnits du(font());
    setFixedSize(du.size(188, 116));

    auto* prompt = new QLabel(QString::fromStdString(m_model.promptText()), this);
    setControlId(*prompt, 1019);
    prompt->setWordWrap(true);
    // The template's box is two lines high; a longer receiver name may need a third.
    prompt->setGeometry(du.rect(7, 15, 166, 25));
    prompt->setAlignment(Qt::AlignLeft | Qt::AlignTop);

    auto* retest = new QPushButton(QString::fromStdString(m_model.retestLabel()), this);
    setControlId(*retest, 1011);
    retest->setGeometry(du.rect(33, 44, 113, 14));
    retest->setDefault(true);
    retest->setAutoDefault(true);

    auto* dontRetest = new QPushButton(app::RcvrCharBadDlg::kDontRetestLabel, this);
    setControlId(*dontRetest, 1010);
    dontRetest->setGeometry(du.rect(15, 62, 158, 14));
    dontRetest->setAutoDefault(false);

    auto* quit = new QPushButton(app::RcvrCharBadDlg::kQuitLabel, this);
    setControlId(*quit, 1016);
    quit->setGeometry(du.rect(63, 82, 50, 14));
    quit->setAutoDefault(false);

    connect(retest, &QPushButton::clicked, this,
            [this] { press(platform::BadDataChoice::Retest); });
    connect(dontRetest, &QPushButton::clicked, this,
            [this] { press(platform::BadDataChoice::Continue); });
    connect(quit, &QPushButton::clicked, this, [this] { press(platform::BadDataChoice::Quit); });
    retest->setFocus();
}

void QtBadDataDialog::press(platform::BadDataChoice button) {
    const BoxOwnerScope ownBoxes(this);
    m_model.press(button, m_ui);
    accept();
}

}  // namespace qtui
