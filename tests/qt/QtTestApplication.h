#pragma once

// One QApplication for the whole test program, on the offscreen platform, so the window
// tests run without a display.

class QApplication;

namespace qttest {

QApplication& qtApplication();

}  // namespace qttest
