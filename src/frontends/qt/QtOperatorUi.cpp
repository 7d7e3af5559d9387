#include "frontends/qt/QtOperatorUi.h"

#include <QAbstractButton>
#include <QApplication>
#include <QMessageBox>
#include <QThread>
#include <condition_variable>
#include <optional>

#include "app/RcvrCharBadDlg.h"
#include "frontends/qt/BoxOwnerScope.h"
#include "frontends/qt/ProgramIcon.h"
#include "frontends/qt/QtBadDataDialog.h"

namespace qtui {

namespace {

QMessageBox::StandardButtons standardButtons(platform::Buttons buttons) {
    switch (buttons) {
        case platform::Buttons::OkCancel:
            return QMessageBox::Ok | QMessageBox::Cancel;
        case platform::Buttons::YesNo:
            return QMessageBox::Yes | QMessageBox::No;
        case platform::Buttons::Ok:
            break;
    }
    return QMessageBox::Ok;
}

platform::Answer closedAnswer(platform::Buttons buttons) {
    switch (buttons) {
        case platform::Buttons::OkCancel:
            return platform::Answer::Cancel;
        case platform::Buttons::YesNo:
            return platform::Answer::No;
        case platform::Buttons::Ok:
            break;
    }
    return platform::Answer::Ok;
}

}  // namespace

QtOperatorUi::QtOperatorUi(QObject* parent) : QObject(parent) {}

QtOperatorUi::~QtOperatorUi() {
    closeWorkerBoxes();
}

bool QtOperatorUi::onUiThread() const {
    return QThread::currentThread() == thread();
}

QWidget* QtOperatorUi::uiOwner() const {
    if (auto* named = BoxOwnerScope::current()) {
        return named;
    }
    if (auto* modal = QApplication::activeModalWidget()) {
        return modal;
    }
    if (auto* active = QApplication::activeWindow()) {
        return active;
    }
    return m_owner.data();
}

std::unique_ptr<QMessageBox> QtOperatorUi::makeBox(const platform::MessageBox& box,
                                                   QWidget* parent) {
    auto widget = std::make_unique<QMessageBox>(parent);
    widget->setWindowTitle(QString::fromStdString(box.caption));
    widget->setTextFormat(Qt::PlainText);
    widget->setText(QString::fromStdString(box.text));
    widget->setStandardButtons(standardButtons(box.buttons));
    widget->setWindowIcon(programIcon());
    switch (box.buttons) {
        case platform::Buttons::OkCancel:
            widget->setDefaultButton(QMessageBox::Ok);
            widget->setEscapeButton(QMessageBox::Cancel);
            break;
        case platform::Buttons::YesNo:
            widget->setDefaultButton(QMessageBox::Yes);
            widget->setEscapeButton(QMessageBox::No);
            break;
        case platform::Buttons::Ok:
            widget->setDefaultButton(QMessageBox::Ok);
            widget->setEscapeButton(QMessageBox::Ok);
            break;
    }
    widget->setIcon((box.flags & platform::BoxIconInformation) ? QMessageBox::Information
                                                               : QMessageBox::NoIcon);
    if (box.flags & platform::BoxTopmost) {
        widget->setWindowFlag(Qt::WindowStaysOnTopHint);
    }
    return widget;
}

platform::Answer QtOperatorUi::answerOf(const QMessageBox& box, platform::Buttons buttons) {
    switch (box.standardButton(box.clickedButton())) {
        case QMessageBox::Ok:
            return platform::Answer::Ok;
        case QMessageBox::Cancel:
            return platform::Answer::Cancel;
        case QMessageBox::Yes:
            return platform::Answer::Yes;
        case QMessageBox::No:
            return platform::Answer::No;
        default:
            return closedAnswer(buttons);
    }
}

template <typename T>
T QtOperatorUi::askFromWorker(std::function<QWidget*(std::function<void(T)>)> show,
                              T closedAnswer) {
    struct Pending {
        std::mutex mutex;
        std::condition_variable answered;
        std::optional<T> answer;
    };
    auto pending = std::make_shared<Pending>();
    auto deliver = [pending](T value) {
        std::lock_guard lock(pending->mutex);
        if (!pending->answer) {
            pending->answer = value;
            pending->answered.notify_all();
        }
    };
    int id = 0;
    {
        std::lock_guard lock(m_mutex);
        if (m_closed) {
            return closedAnswer;
        }
        id = ++m_nextId;
        m_release[id] = [deliver, closedAnswer] { deliver(closedAnswer); };
    }
    QMetaObject::invokeMethod(
        this,
        [this, id, show, deliver] {
            {
                std::lock_guard lock(m_mutex);
                if (m_closed) {
                    return;
                }
            }
            QWidget* widget = show([this, id, deliver](T value) {
                deliver(value);
                std::lock_guard lock(m_mutex);
                m_release.erase(id);
                m_open.erase(id);
            });
            {
                std::lock_guard lock(m_mutex);
                if (m_release.count(id) != 0) {
                    m_open[id] = widget;
                }
            }
            Q_EMIT workerBoxShown(widget);
        },
        Qt::QueuedConnection);
    std::unique_lock lock(pending->mutex);
    pending->answered.wait(lock, [&] { return pending->answer.has_value(); });
    return *pending->answer;
}

platform::Answer QtOperatorUi::messageBox(const platform::MessageBox& box) {
    if (onUiThread()) {
        auto widget = makeBox(box, uiOwner());
        widget->exec();
        return answerOf(*widget, box.buttons);
    }
    return askFromWorker<platform::Answer>(
        [box](std::function<void(platform::Answer)> answer) -> QWidget* {
            // Worker boxes have no owner: they must not hold up the dialog. The box deletes
            // itself when closed.
            QMessageBox* widget = makeBox(box, nullptr).release();
            widget->setAttribute(Qt::WA_DeleteOnClose);
            widget->setWindowModality(Qt::NonModal);
            const platform::Buttons buttons = box.buttons;
            QObject::connect(widget, &QDialog::finished, widget,
                             [widget, buttons, answer] { answer(answerOf(*widget, buttons)); });
            widget->show();
            return widget;
        },
        closedAnswer(box.buttons));
}

platform::BadDataChoice QtOperatorUi::badDataChoice(const std::string& receiver) {
    if (onUiThread()) {
        app::RcvrCharBadDlg model(receiver);
        QtBadDataDialog dialog(model, *this, uiOwner());
        dialog.exec();
        return dialog.choice();
    }
    return askFromWorker<platform::BadDataChoice>(
        [this, receiver](std::function<void(platform::BadDataChoice)> answer) -> QWidget* {
            auto model = std::make_shared<app::RcvrCharBadDlg>(receiver);
            QtBadDataDialog* dialog =
                std::make_unique<QtBadDataDialog>(*model, *this, nullptr).release();
            dialog->setAttribute(Qt::WA_DeleteOnClose);
            dialog->setWindowModality(Qt::NonModal);
            QObject::connect(dialog, &QDialog::finished, dialog,
                             [model, answer] { answer(model->choice()); });
            dialog->show();
            return dialog;
        },
        platform::BadDataChoice::Continue);
}

void QtOperatorUi::closeWorkerBoxes() {
    std::map<int, std::function<void()>> release;
    std::map<int, QPointer<QWidget>> open;
    {
        std::lock_guard lock(m_mutex);
        m_closed = true;
        release.swap(m_release);
        open.swap(m_open);
    }
    for (auto& [id, widget] : open) {
        if (widget) {
            // Destroying does not emit finished; the release below answers instead.
            std::unique_ptr<QWidget> owned(widget.data());
        }
    }
    for (auto& [id, releaseOne] : release) {
        releaseOne();
    }
}

std::size_t QtOperatorUi::openWorkerBoxes() const {
    std::lock_guard lock(m_mutex);
    return m_release.size();
}

}  // namespace qtui
