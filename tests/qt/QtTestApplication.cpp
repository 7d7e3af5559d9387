#include "QtTestApplication.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <memory>

namespace qttest {

namespace {

std::unique_ptr<QApplication>& application() {
    static std::unique_ptr<QApplication> app;
    return app;
}

// Qt must be shut down before the program's static objects go: at the end of the tests.
class QtEnvironment : public ::testing::Environment {
  public:
    void TearDown() override { application().reset(); }
};

// Google Test takes ownership of the environment.
[[maybe_unused]] const auto* const g_environment =
    ::testing::AddGlobalTestEnvironment(std::make_unique<QtEnvironment>().release());

}  // namespace

QApplication& qtApplication() {
    static int argc = 1;
    static char name[] = "test_qt";
    static char* argv[] = {name, nullptr};
    auto& app = application();
    if (!app) {
        // RCVRCHAR_TEST_PLATFORM=xcb shows the windows on a display while the tests run.
        const QByteArray platform = qgetenv("RCVRCHAR_TEST_PLATFORM");
        qputenv("QT_QPA_PLATFORM", platform.isEmpty() ? QByteArray("offscreen") : platform);
        app = std::make_unique<QApplication>(argc, argv);
    }
    return *app;
}

}  // namespace qttest
