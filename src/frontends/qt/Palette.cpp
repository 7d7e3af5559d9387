#include "frontends/qt/Palette.h"

#include <QPalette>

namespace qtui {

void applyDialogBackground(QWidget& widget) {
    QPalette palette = widget.palette();
    palette.setColor(QPalette::Window, kDialogBackground);
    palette.setColor(QPalette::Button, kDialogBackground);
    widget.setPalette(palette);
    widget.setAutoFillBackground(true);
}

}  // namespace qtui
