
#include <gtest/gtest.h>

#include <QApplication>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>
#include <QTimer>
#include <array>
#include <cstdlib>
#include <future>
#include <thread>

#include "QtTestApplication.h"
#include "TempDir.h"
#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/QtBadDataDialog.h"
#include "frontends/qt/QtDialogFrontEnd.h"
#include "frontends/qt/QtOperatorUi.h"
#include "frontends/qt/QtRestartDialog.h"
#include "frontends/qt/RunProgressWatcher.h"
#include "platform/ScriptedOperatorUi.h"

namespace {

using platform::Answer;
using platform::BadDataChoice;
using platform::Buttons;

// Runs the Qt loop until done() or five seconds have passed.
bool spinUntil(const std::function<bool()>& done) {
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(5);
    while (!done()) {
        if (std::chrono::steady_clock::now() > deadline) {
            return false;
        }
        QApplication::processEvents(QEventLoop::AllEvents, 5);
    }
    return true;
}

QMessageBox* visibleBox(const QString& caption) {
    for (auto* widget : QApplication::topLevelWidgets()) {
        auto* box = qobject_cast<QMessageBox*>(widget);
        if (box && box->isVisible() && box->windowTitle() == caption) {
            return box;
        }
    }
    return nullptr;
}

// Asks from a worker thread and waits until the box is on screen.
std::future<Answer> askFromWorker(qtui::QtOperatorUi& ui, const std::string& caption,
                                  Buttons buttons) {
    auto answer = std::async(std::launch::async, [&ui, caption, buttons] {
        return ui.messageBox({"Connect the cable", caption, buttons, 0});
    });
    EXPECT_TRUE(spinUntil([&] { return visibleBox(QString::fromStdString(caption)) != nullptr; }));
    return answer;
}

QAbstractButton* button(QWidget& dialog, int id) {
    return qobject_cast<QAbstractButton*>(qtui::controlById(dialog, id));
}

class QtDialogs : public ::testing::Test {
  protected:
    void SetUp() override { qttest::qtApplication(); }
};

TEST_F(QtDialogs, BadDataDialogIsRelabelledForTheReceiver) {
    app::RcvrCharBadDlg model("B");
    platform::ScriptedOperatorUi ui;
    qtui::QtBadDataDialog dialog(model, ui);
    const qtui::DialogUnits du(dialog.font());
    EXPECT_EQ(dialog.windowTitle(), "Characterization data issue!");
    EXPECT_EQ(dialog.size(), du.size(188, 116));
    EXPECT_EQ(qobject_cast<QLabel*>(qtui::controlById(dialog, 1019))->text(),
              "The characterization data just taken for receiver B appears to be bad.  Please "
              "select an action:");
    EXPECT_TRUE(qobject_cast<QPushButton*>(button(dialog, 1011))->isDefault());
    const std::vector<std::tuple<int, QString, QRect>> buttons = {
        {1011, "Retest Receiver B", du.rect(33, 44, 113, 14)},
        {1010, "Don't retest, continue with remaining receivers.", du.rect(15, 62, 158, 14)},
        {1016, "Quit", du.rect(63, 82, 50, 14)}};
    for (const auto& [id, text, geometry] : buttons) {
        EXPECT_EQ(button(dialog, id)->text(), text) << id;
        EXPECT_EQ(button(dialog, id)->geometry(), geometry) << id;
    }
}

TEST_F(QtDialogs, BadDataDialogButtonsGiveTheirChoices) {
    struct Case {
        int id;
        BadDataChoice choice;
        bool pleaseNote;
    };
    for (const auto& c :
         {Case{1011, BadDataChoice::Retest, true}, Case{1010, BadDataChoice::Continue, false},
          Case{1016, BadDataChoice::Quit, false}}) {
        app::RcvrCharBadDlg model("R2");
        platform::ScriptedOperatorUi ui;
        ui.answerAll(Answer::Ok);
        qtui::QtBadDataDialog dialog(model, ui);
        dialog.show();
        button(dialog, c.id)->click();
        EXPECT_FALSE(dialog.isVisible()) << c.id;
        EXPECT_EQ(dialog.result(), QDialog::Accepted) << c.id;
        EXPECT_EQ(dialog.choice(), c.choice) << c.id;
        EXPECT_EQ(model.quitChosen(), c.choice == BadDataChoice::Quit) << c.id;
        EXPECT_EQ(ui.captions(), c.pleaseNote ? std::vector<std::string>{"Please Note"}
                                              : std::vector<std::string>{})
            << c.id;
    }
    // Closing the window counts as "Don't retest".
    app::RcvrCharBadDlg model("R2");
    platform::ScriptedOperatorUi ui;
    qtui::QtBadDataDialog dialog(model, ui);
    dialog.show();
    dialog.close();
    EXPECT_EQ(dialog.choice(), BadDataChoice::Continue);
}

TEST_F(QtDialogs, RestartNoticeShowsItsText) {
    qtui::QtRestartDialog notice("Restart", "Restarting TVA Application");
    const qtui::DialogUnits du(notice.font());
    EXPECT_EQ(notice.windowTitle(), "Restart");
    EXPECT_EQ(notice.size(), du.size(118, 46));
    auto* text = qobject_cast<QLabel*>(qtui::controlById(notice, 1008));
    ASSERT_NE(text, nullptr);
    EXPECT_EQ(text->text(), "Restarting TVA Application");
    EXPECT_EQ(text->geometry(), du.rect(18, 20, 89, 12));
}

TEST_F(QtDialogs, BoxesMapCaptionTextButtonsAndAnswers) {
    // closed: the answer when no button was pressed; pressed: that of the default button.
    const auto expect = [](Buttons buttons, unsigned flags, QMessageBox::StandardButtons shown,
                           QMessageBox::Icon icon, QMessageBox::StandardButton defaultButton,
                           Answer pressed, Answer closed) {
        SCOPED_TRACE(static_cast<int>(buttons));
        auto box = qtui::QtOperatorUi::makeBox({"Delete?\nSecond line", "Delete?", buttons, flags},
                                               nullptr);
        EXPECT_EQ(box->windowTitle(), "Delete?");
        EXPECT_EQ(box->text(), "Delete?\nSecond line");
        EXPECT_EQ(box->textFormat(), Qt::PlainText);
        EXPECT_EQ(box->standardButtons(), shown);
        EXPECT_EQ(box->icon(), icon);
        EXPECT_EQ(bool(box->windowFlags() & Qt::WindowStaysOnTopHint),
                  bool(flags & platform::BoxTopmost));
        EXPECT_EQ(qtui::QtOperatorUi::answerOf(*box, buttons), closed);
        EXPECT_EQ(box->standardButton(box->defaultButton()), defaultButton);
        box->button(defaultButton)->click();
        EXPECT_EQ(qtui::QtOperatorUi::answerOf(*box, buttons), pressed);
    };
    expect(Buttons::YesNo, platform::BoxTopmost | platform::BoxIconInformation,
           QMessageBox::Yes | QMessageBox::No, QMessageBox::Information, QMessageBox::Yes,
           Answer::Yes, Answer::No);
    expect(Buttons::OkCancel, 0, QMessageBox::Ok | QMessageBox::Cancel, QMessageBox::NoIcon,
           QMessageBox::Ok, Answer::Ok, Answer::Cancel);
    expect(Buttons::Ok, 0, QMessageBox::Ok, QMessageBox::NoIcon, QMessageBox::Ok, Answer::Ok,
           Answer::Ok);
}

TEST_F(QtDialogs, UiThreadBoxIsModalAndReturnsTheButtonPressed) {
    qtui::QtOperatorUi ui;
    bool wasModal = false;
    QTimer::singleShot(20, [&] {
        QMessageBox* box = visibleBox("Abort now?");
        ASSERT_NE(box, nullptr);
        wasModal = box->isModal();
        box->button(QMessageBox::No)->click();
    });
    EXPECT_EQ(ui.messageBox({"Are you sure you want to abort?", "Abort now?", Buttons::YesNo,
                             platform::BoxSystemModal}),
              Answer::No);
    EXPECT_TRUE(wasModal);
}

TEST_F(QtDialogs, WorkerBoxLeavesTheUiThreadFreeAndOnlyTheWorkerWaits) {
    qtui::QtOperatorUi ui;
    auto answer = askFromWorker(ui, "Connections", Buttons::OkCancel);
    QMessageBox* box = visibleBox("Connections");
    ASSERT_NE(box, nullptr);
    EXPECT_FALSE(box->isModal());
    EXPECT_EQ(box->parentWidget(), nullptr);
    EXPECT_EQ(QApplication::activeModalWidget(), nullptr);
    EXPECT_EQ(ui.openWorkerBoxes(), 1u);
    EXPECT_EQ(answer.wait_for(std::chrono::milliseconds(0)), std::future_status::timeout);
    box->button(QMessageBox::Cancel)->click();
    EXPECT_EQ(answer.get(), Answer::Cancel);
    EXPECT_EQ(ui.openWorkerBoxes(), 0u);

    // Closing the worker's boxes releases it with the closed answer, now and later.
    auto closed = askFromWorker(ui, "Check Connection", Buttons::YesNo);
    ui.closeWorkerBoxes();
    EXPECT_EQ(closed.get(), Answer::No);
    EXPECT_EQ(visibleBox("Check Connection"), nullptr);
    auto later = std::async(std::launch::async, [&] {
        return ui.messageBox({"Again", "Connections", Buttons::OkCancel, 0});
    });
    EXPECT_EQ(later.get(), Answer::Cancel);
}

TEST_F(QtDialogs, WorkerBadDataDialogShowsPleaseNoteOwnedByTheDialog) {
    qtui::QtOperatorUi ui;
    auto choice = std::async(std::launch::async, [&] { return ui.badDataChoice("C"); });
    qtui::QtBadDataDialog* dialog = nullptr;
    ASSERT_TRUE(spinUntil([&] {
        for (auto* widget : QApplication::topLevelWidgets()) {
            if (auto* found = qobject_cast<qtui::QtBadDataDialog*>(widget);
                found && found->isVisible()) {
                dialog = found;
            }
        }
        return dialog != nullptr;
    }));
    // Another window being active must not take the note over.
    QWidget elsewhere;
    elsewhere.show();
    QApplication::setActiveWindow(&elsewhere);
    QWidget* owner = nullptr;
    QTimer::singleShot(20, [&] {
        QMessageBox* note = visibleBox("Please Note");
        ASSERT_NE(note, nullptr);
        owner = note->parentWidget();
        note->button(QMessageBox::Ok)->click();
    });
    button(*dialog, 1011)->click();
    EXPECT_EQ(choice.get(), BadDataChoice::Retest);
    EXPECT_EQ(owner, dialog);
}

TEST(QtRunProgress, CompletionIsReportedForTheReceiverUnderWay) {
    qtui::RunProgressWatcher watcher;
    EXPECT_EQ(watcher.onNotice("Cal Started\r\n"), std::nullopt);
    EXPECT_EQ(watcher.onNotice("Started Cal R1 LOW FREQUENCY EXTENSION\r\n"), std::nullopt);
    EXPECT_EQ(watcher.onNotice("Cal will be repeated\r\n"), std::nullopt);
    EXPECT_EQ(watcher.onNotice("Cal Complete\r\n"), "R1 LOW FREQUENCY EXTENSION");
    // A second completion without a new start names nobody.
    EXPECT_EQ(watcher.onNotice("Cal Complete\r\n"), std::nullopt);
    watcher.onNotice("Started Cal A\r\n");
    watcher.onNotice("Characterization Aborted\r\n");
    EXPECT_EQ(watcher.onNotice("Cal Complete\r\n"), std::nullopt);
}

TEST(QtDisplay, MissingDisplayIsExplained) {
    using Value = std::optional<std::string>;
    const Value unset;
    const std::array<const char*, 3> names = {"QT_QPA_PLATFORM", "WAYLAND_DISPLAY", "DISPLAY"};
    const std::vector<std::pair<std::array<Value, 3>, Value>> cases = {
        {{unset, unset, unset}, "no display: neither DISPLAY nor WAYLAND_DISPLAY is set"},
        {{unset, unset, ":4711.0"},
         "no display: DISPLAY is :4711.0 but no X server listens at /tmp/.X11-unix/X4711"},
        {{"offscreen", unset, unset}, unset},
        {{unset, "wayland-0", unset}, unset},
    };
    const auto setAll = [&](const std::array<Value, 3>& values) {
        for (std::size_t n = 0; n < names.size(); ++n) {
            values[n] ? setenv(names[n], values[n]->c_str(), 1) : unsetenv(names[n]);
        }
    };
    std::array<Value, 3> saved;
    for (std::size_t n = 0; n < names.size(); ++n) {
        saved[n] = std::getenv(names[n]) ? Value(std::getenv(names[n])) : unset;
    }
    for (std::size_t i = 0; i < cases.size(); ++i) {
        setAll(cases[i].first);
        EXPECT_EQ(qtui::missingDisplay(), cases[i].second) << "case " << i;
    }
    setAll(saved);
}

}  // namespace
