
#include "frontends/qt/QtDialogFrontEnd.h"

#include <QApplication>
#include <QEventLoop>
#include <QTimer>
#include <cstdlib>
#include <filesystem>

#include "app/CTarvexApp.h"
#include "frontends/qt/CharacterizationWindow.h"
#include "frontends/qt/QtOperatorUi.h"
#include "frontends/qt/TarvexWindow.h"
#include "platform/ErrorText.h"
#include "storage/ReceiverNames.h"

namespace qtui {

namespace {

constexpr int kDrainStepMs = 20;

std::string environment(const char* name) {
    const char* value = std::getenv(name);
    return value ? value : "";
}

// Keeps the Qt loop turning until the worker has stopped, so that its open boxes can still
// be answered and its notices appended.
void waitForWorker(app::CTarvexDlg& dlg, platform::RunSignals& signals) {
    if (!dlg.workerRunning()) {
        return;
    }
    signals.abortRequested = true;
    while (dlg.workerRunning()) {
        QEventLoop loop;
        QTimer::singleShot(kDrainStepMs, &loop, &QEventLoop::quit);
        loop.exec();
    }
}

void plotCompleted(const std::filesystem::path& workingDirectory, const QString& receiver,
                   CharacterizationWindow& plots) {
    const std::string name = receiver.toStdString();
    const auto raw =
        workingDirectory / ("rcvrCharRaw_" + storage::shortReceiverName(name) + ".txt");
    try {
        plots.showCharacterization(name, loadCharacterization(raw));
    } catch (...) {
        qWarning("No plot for receiver %s: %s", name.c_str(), platform::currentErrorText().c_str());
    }
}

}  // namespace

std::optional<std::string> missingDisplay() {
    if (!environment("QT_QPA_PLATFORM").empty()) {
        return std::nullopt;
    }
    if (!environment("WAYLAND_DISPLAY").empty()) {
        return std::nullopt;
    }
    const std::string display = environment("DISPLAY");
    if (display.empty()) {
        return "no display: neither DISPLAY nor WAYLAND_DISPLAY is set";
    }
    // A local display ":N" or ":N.S" is served through its socket.
    if (display[0] == ':') {
        const std::string number = display.substr(1, display.find('.') - 1);
        const auto socket = std::filesystem::path("/tmp/.X11-unix") / ("X" + number);
        if (!std::filesystem::exists(socket)) {
            return "no display: DISPLAY is " + display + " but no X server listens at " +
                   socket.string();
        }
    }
    return std::nullopt;
}

int runQtDialog(QtSetup& setup, std::ostream& err) {
    std::unique_ptr<QApplication> ownApp;
    if (QCoreApplication::instance() == nullptr) {
        if (auto reason = missingDisplay()) {
            err << "rcvrchar --gui: " << *reason
                << "; run rcvrchar without --gui for the console front end\n";
            return 1;
        }
        static int argc = 1;
        static char name[] = "rcvrchar";
        static char* argv[] = {name, nullptr};
        ownApp = std::make_unique<QApplication>(argc, argv);
    }

    app::UiTaskQueue queue;
    QtOperatorUi qtUi;
    std::shared_ptr<platform::OperatorUi> wrapped;
    if (setup.wrapUi) {
        wrapped = setup.wrapUi(qtUi);
    }
    platform::OperatorUi& ui = wrapped ? *wrapped : qtUi;
    TarvexWindow window(queue);
    if (!setup.instrument.empty()) {
        window.setWindowTitle(window.windowTitle() + " - " +
                              QString::fromStdString(setup.instrument));
    }
    qtUi.setOwner(&window);
    CharacterizationWindow plots;
    QObject::connect(&window, &TarvexWindow::receiverCompleted, &plots,
                     [&](const QString& receiver) {
                         // Later, so the worker is not held while the file is read.
                         QTimer::singleShot(0, &plots, [&, receiver] {
                             plotCompleted(setup.workingDirectory, receiver, plots);
                         });
                     });
    // Lives as long as the windows: the callback may keep it.
    QtFrontEndParts parts{window, qtUi, plots};
    if (setup.onWindow) {
        setup.onWindow(parts);
    }

    app::DialogServices services{.ui = ui,
                                 .clock = setup.clock,
                                 .paths = setup.paths,
                                 .processes = setup.processes,
                                 .signals = setup.signals,
                                 .workingDirectory = setup.workingDirectory};
    app::CTarvexApp application(window, services, queue);
    int status = 1;
    try {
        status = application.run([&](app::CTarvexDlg& dlg) {
            window.setController(&dlg);
            if (!window.ended()) {
                window.show();
                QEventLoop loop;
                QObject::connect(&window, &TarvexWindow::dialogEnded, &loop, &QEventLoop::quit);
                loop.exec();
            }
            waitForWorker(dlg, setup.signals);
            window.setController(nullptr);
            if (window.stopStatus()) {
                throw app::ProgramStop{*window.stopStatus()};
            }
            if (window.failure()) {
                throw *window.failure();
            }
        });
    } catch (const app::ProgramStop& stopRequest) {
        status = stopRequest.status;
    }
    qtUi.closeWorkerBoxes();
    return status;
}

}  // namespace qtui
