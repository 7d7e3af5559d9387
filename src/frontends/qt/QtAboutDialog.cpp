#include "frontends/qt/QtAboutDialog.h"

#include <QLabel>
#include <QPushButton>

#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/Palette.h"
#include "frontends/qt/ProgramIcon.h"

namespace qtui {

QtAboutDialog::QtAboutDialog(const app::CAboutDlg& about, QWidget* parent) : QDialog(parent) {
    setWindowTitle(app::CAboutDlg::kTitle);
    setWindowIcon(programIcon());
    applyDialogBackground(*this);
    const DialogUnits du(font());
    setFixedSize(du.size(235, 55));

    auto* icon = new QLabel(this);
    icon->setPixmap(programIcon().pixmap(32, 32));
    icon->move(du.x(11), du.y(17));
    icon->resize(32, 32);

    auto* version = new QLabel(QString::fromStdString(about.versionText()), this);
    setControlId(*version, 1006);
    version->setGeometry(du.rect(40, 10, 119, 8));

    auto* ownership = new QLabel(QString::fromStdString(about.ownershipText()), this);
    ownership->setGeometry(du.rect(40, 25, 190, 8));

    auto* ok = new QPushButton("OK", this);
    setControlId(*ok, 1);
    ok->setGeometry(du.rect(178, 7, 50, 16));
    ok->setDefault(true);
    connect(ok, &QPushButton::clicked, this, &QDialog::accept);
}

}  // namespace qtui
