#include "QtTestApplication.h"

#include <QApplication>

namespace qttest {

QApplication& qtApplication() {
    static int argc = 1;
    static char name[] = "test_qt";
    static char* argv[] = {name, nullptr};
    static QApplication* app = [] {
        qputenv("QT_QPA_PLATFORM", "offscreen");
        // Kept for the whole process: Qt's own shutdown must not race static destructors.
        static QApplication instance(argc, argv);
        return &instance;
    }();
    return *app;
}

}  // namespace qttest
