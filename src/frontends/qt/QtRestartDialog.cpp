#include "frontends/qt/QtRestartDialog.h"

#include <QLabel>

#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/Palette.h"
#include "frontends/qt/ProgramIcon.h"

namespace qtui {

QtRestartDialog::QtRestartDialog(const QString& title, const QString& text, QWidget* parent)
    : QDialog(parent, Qt::Dialog | Qt::WindowTitleHint) {
    setWindowTitle(title);
    setWindowIcon(programIcon());
    applyDialogBackground(*this);
    const DialogUnits du(font());
    setFixedSize(du.size(118, 46));
    auto* label = new QLabel(text, this);
    setControlId(*label, 1008);
    label->setGeometry(du.rect(18, 20, 89, 12));
}

}  // namespace qtui
