#include "frontends/qt/ControlIds.h"

#include <QVariant>

namespace qtui {

void setControlId(QWidget& control, int id) {
    control.setProperty(kControlIdProperty, id);
    control.setObjectName(QString("control%1").arg(id));
}

QWidget* controlById(const QWidget& parent, int id) {
    for (auto* child : parent.findChildren<QWidget*>()) {
        const QVariant value = child->property(kControlIdProperty);
        if (value.isValid() && value.toInt() == id) {
            return child;
        }
    }
    return nullptr;
}

}  // namespace qtui
