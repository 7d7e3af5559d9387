
#include <gtest/gtest.h>

#include "app/CTarvexApp.h"

#include <QApplication>
#include <QLabel>
#include <QListWidget>
#include <QMenu>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QTest>

#include "QtTestApplication.h"
#include "WindowBench.h"
#include "WindowOperator.h"
#include "app/CTarvexDlg.h"
#include "frontends/qt/CharacterizationWindow.h"
#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/QtAboutDialog.h"
#include "frontends/qt/QtOperatorUi.h"
#include "frontends/qt/TarvexWindow.h"

namespace {

using qtui::TarvexWindow;

template <typename T>
T* control(const TarvexWindow& window, int id) {
    auto* widget = qobject_cast<T*>(qtui::controlById(window, id));
    EXPECT_NE(widget, nullptr) << "control " << id;
    return widget;
}

QString logOf(const TarvexWindow& window) {
    return control<QPlainTextEdit>(window, 1004)->toPlainText();
}

bool idle(const TarvexWindow& window) {
    return window.isVisible() && window.controller() != nullptr && window.controller()->idle();
}

void click(const TarvexWindow& window, int id) {
    control<QPushButton>(window, id)->click();
}

// Toggles a list item the way the operator does: a click on it.
void clickReceiver(const TarvexWindow& window, const QString& name) {
    auto* list = control<QListWidget>(window, 1005);
    const auto items = list->findItems(name, Qt::MatchExactly);
    ASSERT_EQ(items.size(), 1) << name.toStdString();
    const QRect rect = list->visualItemRect(items.front());
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, rect.center());
}

qtui::QtAboutDialog* visibleAbout() {
    for (auto* widget : QApplication::topLevelWidgets()) {
        if (auto* about = qobject_cast<qtui::QtAboutDialog*>(widget); about && about->isVisible()) {
            return about;
        }
    }
    return nullptr;
}

// Clears the selection, picks these receivers and starts the run.
void runOnly(const TarvexWindow& window, const std::vector<QString>& receivers) {
    click(window, 1003);
    for (const auto& name : receivers) {
        clickReceiver(window, name);
    }
    click(window, 1000);
}

void whenIdle(qttest::WindowOperator& op, const TarvexWindow& w, std::function<void()> act) {
    op.then(
        "the idle dialog", [&w] { return idle(w); }, std::move(act));
}

// Runs the window with these operator steps; it must end with the status and every step done.
void runWindow(qttest::WindowBench& bench, qttest::WindowOperator& op,
               const std::function<void(qtui::QtFrontEndParts&, TarvexWindow&)>& steps,
               int expectedStatus = 0) {
    const int status = bench.run([&](qtui::QtFrontEndParts& parts) {
        steps(parts, parts.window);
        op.start();
    });
    EXPECT_EQ(status, expectedStatus);
    EXPECT_TRUE(op.allStepsDone());
}

// Indexes of wanted in seen, in order; fails when one is missing.
void expectInOrder(const std::vector<QString>& seen, const std::vector<QString>& wanted) {
    std::size_t at = 0;
    for (const auto& caption : wanted) {
        while (at < seen.size() && seen[at] != caption) {
            ++at;
        }
        ASSERT_LT(at, seen.size())
            << "box \"" << caption.toStdString() << "\" missing or out of order";
        ++at;
    }
}

TEST(QtMainWindow, ControlsFollowTheTemplateAndSelectAllClearAllAndAboutWork) {
    qttest::WindowBench bench;
    qttest::WindowOperator op;
    QString aboutVersion;
    runWindow(bench, op, [&](qtui::QtFrontEndParts&, TarvexWindow& w) {
        whenIdle(op, w, [&] {
            EXPECT_EQ(w.windowTitle().toStdString(),
                      "Receiver Characterization - " + bench.simulator->scenario().idn);
            const qtui::DialogUnits du(w.font());
            EXPECT_EQ(w.size(), du.size(319, 202));
            EXPECT_EQ(w.palette().color(QPalette::Window), QColor(232, 232, 232));
            struct Expected {
                int id;
                const char* label;
                QRect units;
            };
            for (const auto& e : {Expected{1, "E&xit", {216, 113, 96, 26}},
                                  Expected{1000, "&Run Characterization", {8, 113, 96, 26}},
                                  Expected{1001, "&Abort Cal", {112, 113, 96, 26}},
                                  Expected{1002, "&Select All", {216, 50, 96, 26}},
                                  Expected{1003, "C&lear All", {216, 81, 96, 26}},
                                  Expected{1022, "", {199, 7, 7, 16}}}) {
                auto* button = control<QPushButton>(w, e.id);
                ASSERT_NE(button, nullptr);
                EXPECT_EQ(button->text(), e.label) << e.id;
                EXPECT_EQ(button->geometry(),
                          du.rect(e.units.x(), e.units.y(), e.units.width(), e.units.height()))
                    << e.id;
            }
            EXPECT_TRUE(control<QPushButton>(w, 1)->isDefault());
            EXPECT_FALSE(control<QPushButton>(w, 1001)->isEnabled());
            EXPECT_TRUE(control<QPushButton>(w, 1000)->isEnabled());

            auto* log = control<QPlainTextEdit>(w, 1004);
            EXPECT_TRUE(log->isReadOnly());
            EXPECT_EQ(log->geometry(), du.rect(7, 147, 305, 48));
            EXPECT_EQ(log->lineWrapMode(), QPlainTextEdit::NoWrap);
            EXPECT_EQ(log->toPlainText(),
                      "This Characterization will run in two parts: first R channels, then port "
                      "receivers.\nAccessories you will need:\n"
                      "1)  RF cable with 3.5mm connectors (F-F)\n"
                      "2)  3.5mm pad(s) totalling approximately 20dB\n");

            auto* list = control<QListWidget>(w, 1005);
            EXPECT_EQ(list->selectionMode(), QAbstractItemView::MultiSelection);
            EXPECT_EQ(list->geometry(), du.rect(7, 22, 198, 86));
            QStringList names;
            for (int i = 0; i < list->count(); ++i) {
                names << list->item(i)->text();
                EXPECT_TRUE(list->item(i)->isSelected()) << i;
            }
            QStringList expected;
            for (const auto& name : w.controller()->receivers()) {
                expected << QString::fromStdString(name);
            }
            EXPECT_EQ(names, expected);
            EXPECT_TRUE(names.contains("R1") && names.contains("A"));

            auto* prompt = w.findChild<QLabel*>("selectPrompt");
            ASSERT_NE(prompt, nullptr);
            EXPECT_EQ(prompt->text(), "Please select the receivers to characterize  ");
            EXPECT_EQ(prompt->geometry(), du.rect(12, 9, 176, 8));

            const auto actions = w.windowMenu().actions();
            ASSERT_GE(actions.size(), 2);
            EXPECT_TRUE(actions[actions.size() - 2]->isSeparator());
            EXPECT_EQ(actions.back()->text(), "&About Receiver Characterization...");
            EXPECT_FALSE(w.windowIcon().isNull());
            EXPECT_FALSE(w.runTimer().isActive());

            click(w, 1003);
            EXPECT_TRUE(w.controller()->selectedReceivers().empty());
            EXPECT_TRUE(list->selectedItems().isEmpty());
            clickReceiver(w, "A");
            EXPECT_EQ(w.controller()->selectedReceivers(), std::vector<std::string>{"A"});
            click(w, 1002);
            EXPECT_EQ(list->selectedItems().size(), list->count());
            w.aboutAction().trigger();
        });
        op.then(
            "the About box", [] { return visibleAbout() != nullptr; },
            [&] {
                auto* about = visibleAbout();
                EXPECT_EQ(about->windowTitle(), "About Receiver Characterization");
                EXPECT_TRUE(about->isModal());
                aboutVersion = qobject_cast<QLabel*>(qtui::controlById(*about, 1006))->text();
                qobject_cast<QPushButton*>(qtui::controlById(*about, 1))->click();
            });
        op.then(
            "the About box closed", [&] { return idle(w) && !QApplication::activeModalWidget(); },
            [&] { click(w, 1); });
    });
    EXPECT_EQ(aboutVersion, "13.55.06.0");
    // Exit without a run: no question and no restart.
    EXPECT_TRUE(op.seen().empty());
    EXPECT_FALSE(bench.signals.restartRequested);
}

TEST(QtMainWindow, TracedExampleRunsThroughTheWindowAndPlotsEachReceiver) {
    qttest::WindowBench bench;
    qttest::WindowOperator op;
    op.answerBoxesByDefault();
    QString log;
    QStringList plotted;
    runWindow(bench, op, [&](qtui::QtFrontEndParts& parts, TarvexWindow& w) {
        whenIdle(op, w, [&] { runOnly(w, {"R1", "A"}); });
        op.then(
            "the completion notice",
            [&] {
                return idle(w) &&
                       logOf(w).contains("All requested cals complete, click Exit to apply.");
            },
            [&] {
                log = logOf(w);
                plotted = parts.plots.receivers();
                EXPECT_TRUE(control<QPushButton>(w, 1000)->isEnabled());
                EXPECT_EQ(control<QPushButton>(w, 1001)->isEnabled(),
                          w.controller()->abortEnabled());
                EXPECT_FALSE(w.runTimer().isActive());
                click(w, 1);
            });
    });
    expectInOrder(op.captions(),
                  {"Some Cals Deferred", "Connections", "Reload TVA cals and continue now?",
                   "Reload now?", "Connections"});
    for (const auto& box : op.seen()) {
        if (box.caption == "Connections") {
            EXPECT_TRUE(box.fromWorker) << box.text.toStdString();
        }
        if (box.caption == "Reload TVA cals and continue now?") {
            EXPECT_FALSE(box.fromWorker);
            EXPECT_TRUE(box.text.startsWith(
                "The cal will automatically reload cals on the TVA before calibrating "
                "receiver(s): A\n"));
        }
    }
    const auto r1 = log.indexOf("Started Cal R1\n");
    const auto a = log.indexOf("Started Cal A\n");
    ASSERT_GE(r1, 0);
    ASSERT_GT(a, r1);
    EXPECT_EQ(log.count("Cal Complete\n"), 2);
    EXPECT_TRUE(log.endsWith("All requested cals complete, click Exit to apply.\n"));
    EXPECT_EQ(plotted, (QStringList{"R1", "A"}));
    EXPECT_TRUE(bench.signals.restartRequested);
}

TEST(QtMainWindow, AbortStaysUsableWhileAWorkerBoxIsOpen) {
    qttest::WindowBench bench;
    qttest::WindowOperator op;
    op.answerBoxesByDefault();  // "Abort now?" is confirmed by its default Yes
    op.hold("Connections");
    QString logAfterAbort;
    runWindow(
        bench, op,
        [&](qtui::QtFrontEndParts& parts, TarvexWindow& w) {
            whenIdle(op, w, [&] { runOnly(w, {"R1"}); });
            op.then(
                "the worker's Connections box", [&] { return op.heldBox() != nullptr; },
                [&] {
                    EXPECT_EQ(parts.ui.openWorkerBoxes(), 1u);
                    EXPECT_TRUE(control<QPushButton>(w, 1001)->isEnabled());
                    // The dialog is not blocked by the worker's box.
                    EXPECT_EQ(QApplication::activeModalWidget(), nullptr);
                    click(w, 1001);
                });
            op.then(
                "the abort request", [&] { return logOf(w).contains("Abort Requested\n"); },
                [&] {
                    logAfterAbort = logOf(w);
                    EXPECT_FALSE(control<QPushButton>(w, 1001)->isEnabled());
                    EXPECT_TRUE(w.controller()->workerRunning());
                    op.release();
                });
            op.then(
                "the aborted run", [&] { return idle(w); }, [&] { click(w, 1); });
        },
        app::CTarvexApp::exitRunFailed);
    expectInOrder(op.captions(), {"Connections", "Abort now?"});
    EXPECT_FALSE(logAfterAbort.contains("Characterization Aborted"));
}

TEST(QtMainWindow, CloseDuringARunEndsOnlyAfterTheWorkerHasStopped) {
    qttest::WindowBench bench;
    qttest::WindowOperator op;
    op.answerBoxesByDefault();
    op.hold("Connections");
    bool workerRunningAtEnd = true;
    QString finalLog;
    runWindow(
        bench, op,
        [&](qtui::QtFrontEndParts&, TarvexWindow& w) {
            QObject::connect(&w, &TarvexWindow::dialogEnded, [&] {
                workerRunningAtEnd = w.controller()->workerRunning();
                finalLog = logOf(w);
            });
            whenIdle(op, w, [&] { runOnly(w, {"R1"}); });
            op.then(
                "the worker's Connections box", [&] { return op.heldBox() != nullptr; },
                [&] { w.close(); });
            op.then(
                "the close request",
                [&] { return logOf(w).contains("Aborting Characterization\n"); },
                [&] {
                    EXPECT_TRUE(w.isVisible());
                    EXPECT_FALSE(w.ended());
                    EXPECT_TRUE(w.controller()->workerRunning());
                    op.release();
                });
        },
        app::CTarvexApp::exitRunFailed);
    EXPECT_FALSE(workerRunningAtEnd);
    EXPECT_TRUE(finalLog.contains("Aborting Characterization\nCharacterization Aborted\n"))
        << finalLog.toStdString();
}

TEST(QtMainWindow, BadDataDialogRetestShowsPleaseNoteAndMeasuresAgain) {
    qttest::WindowBench bench(R"("faults": {"bad_data": {"R1": 1}})");
    qttest::WindowOperator op;
    op.answerBoxesByDefault();
    op.badData(1011);
    QString log;
    runWindow(bench, op, [&](qtui::QtFrontEndParts&, TarvexWindow& w) {
        whenIdle(op, w, [&] { runOnly(w, {"R1"}); });
        op.then(
            "the end of the run",
            [&] { return idle(w) && logOf(w).contains("All requested cals complete"); },
            [&] {
                log = logOf(w);
                click(w, 1);
            });
    });
    expectInOrder(op.captions(), {"Characterization data issue!", "Please Note"});
    for (const auto& box : op.seen()) {
        if (box.caption == "Please Note") {
            EXPECT_TRUE(box.text.startsWith("Before retesting this receiver, please:\n"));
        }
    }
    EXPECT_EQ(log.count("Cal will be repeated\n"), 1) << log.toStdString();
    EXPECT_EQ(log.count("Cal Complete\n"), 1);
}

}  // namespace

TEST(QtMainWindow, ARawFileThatCannotBeWrittenIsAnErrorBoxAndStatusThree) {
    qttest::WindowBench bench;
    // A folder where the CSV's partial file must go: the write fails whatever the user.
    std::filesystem::create_directory(bench.workDir() / "RcvrChar_AllMeasuredData_R1.csv.partial");
    qttest::WindowOperator op;
    op.answerBoxesByDefault();
    QString log;
    runWindow(
        bench, op,
        [&](qtui::QtFrontEndParts&, TarvexWindow& w) {
            whenIdle(op, w, [&] { runOnly(w, {"R1"}); });
            op.then(
                "the completion notice",
                [&] {
                    return idle(w) &&
                           logOf(w).contains("All requested cals complete, click Exit to apply.");
                },
                [&] {
                    log = logOf(w);
                    click(w, 1);
                });
        },
        app::CTarvexApp::exitRunFailed);
    expectInOrder(op.captions(), {"Connections", "Error"});
    for (const auto& box : op.seen()) {
        if (box.caption == "Error") {
            EXPECT_TRUE(box.fromWorker);
            EXPECT_TRUE(
                box.text.startsWith("Cannot write the raw measured data "
                                    "RcvrChar_AllMeasuredData_R1.csv ("))
                << box.text.toStdString();
        }
    }
    EXPECT_TRUE(log.contains("File not written: Cannot write the raw measured data"));
    EXPECT_TRUE(log.contains("Cal Complete\n"));
}
