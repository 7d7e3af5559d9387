#include "frontends/qt/ProgramIcon.h"

#include <QPainter>
#include <QPainterPath>
#include <QPixmap>

namespace qtui {

namespace {

QPixmap drawIcon(int size) {
    QPixmap pixmap(size, size);
    pixmap.fill(Qt::transparent);
    QPainter painter(&pixmap);
    painter.setRenderHint(QPainter::Antialiasing);
    const double s = size;
    painter.setBrush(QColor(30, 70, 140));
    painter.setPen(Qt::NoPen);
    painter.drawRoundedRect(QRectF(0.5, 0.5, s - 1, s - 1), s / 6, s / 6);
    // A compression curve: linear, then bending over.
    QPainterPath curve;
    curve.moveTo(0.15 * s, 0.85 * s);
    curve.lineTo(0.5 * s, 0.45 * s);
    curve.quadTo(0.65 * s, 0.28 * s, 0.88 * s, 0.25 * s);
    painter.setBrush(Qt::NoBrush);
    painter.setPen(QPen(QColor(250, 200, 60), std::max(1.5, s / 12)));
    painter.drawPath(curve);
    return pixmap;
}

}  // namespace

QIcon programIcon() {
    QIcon icon;
    for (int size : {16, 32, 48}) {
        icon.addPixmap(drawIcon(size));
    }
    return icon;
}

}  // namespace qtui
