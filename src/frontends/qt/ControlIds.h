#pragma once

// Every control carries its template id, so that tests and tools can find it by id.

#include <QWidget>

namespace qtui {

inline constexpr const char* kControlIdProperty = "controlId";

void setControlId(QWidget& control, int id);
// The child of parent with that id, or nullptr.
QWidget* controlById(const QWidget& parent, int id);

}  // namespace qtui
