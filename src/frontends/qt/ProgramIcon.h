#pragma once

#include <QIcon>

namespace qtui {

// The program's icon, drawn rather than loaded so the front end needs no resource files.
QIcon programIcon();

}  // namespace qtui
