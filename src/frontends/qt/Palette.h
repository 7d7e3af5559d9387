#pragma once

#include <QColor>
#include <QWidget>

namespace qtui {

// The background of every dialog of the program.
inline const QColor kDialogBackground(232, 232, 232);

// Paints widget and its children on the dialog background.
void applyDialogBackground(QWidget& widget);

}  // namespace qtui
