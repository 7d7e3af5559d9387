#pragma once

// One QApplication for the whole test program, on the offscreen platform, so the window
// tests run without a display.

class QApplication;

namespace qttest {

QApplication& qtApplication();

}  // namespace qttest

#include <QString>
#include <ostream>

// Readable QString values in test failure messages.
inline void PrintTo(const QString& text, std::ostream* out) {
    *out << '"' << text.toStdString() << '"';
}
