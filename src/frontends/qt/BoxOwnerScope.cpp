#include "frontends/qt/BoxOwnerScope.h"

namespace qtui {

namespace {

// Boxes are raised on the UI thread only, so one owner slot serves the program.
QPointer<QWidget>& currentOwner() {
    static QPointer<QWidget> owner;
    return owner;
}

}  // namespace

BoxOwnerScope::BoxOwnerScope(QWidget* owner) : m_previous(currentOwner()) {
    currentOwner() = owner;
}

BoxOwnerScope::~BoxOwnerScope() {
    currentOwner() = m_previous;
}

QWidget* BoxOwnerScope::current() {
    return currentOwner().data();
}

}  // namespace qtui
