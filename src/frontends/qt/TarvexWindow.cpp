#include "frontends/qt/TarvexWindow.h"

#include <QCloseEvent>
#include <QContextMenuEvent>
#include <QCoreApplication>
#include <QLabel>
#include <QListWidget>
#include <QMenu>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QScrollBar>
#include <QShortcut>

#include "app/CTarvexDlg.h"
#include "app/DialogServices.h"
#include "app/UiTaskQueue.h"
#include "frontends/qt/ControlIds.h"
#include "frontends/qt/DialogUnits.h"
#include "frontends/qt/Palette.h"
#include "frontends/qt/ProgramIcon.h"
#include "frontends/qt/QtAboutDialog.h"
#include "frontends/qt/QtRestartDialog.h"
#include "platform/ErrorText.h"

namespace qtui {

namespace {

constexpr int kPumpIntervalMs = 5;

QPushButton* makeButton(QWidget& parent, const DialogUnits& du, int id, const QString& label,
                        QRect units) {
    auto* button = new QPushButton(label, &parent);
    setControlId(*button, id);
    button->setGeometry(du.rect(units.x(), units.y(), units.width(), units.height()));
    button->setAutoDefault(false);
    return button;
}

}  // namespace

TarvexWindow::TarvexWindow(app::UiTaskQueue& queue, QWidget* parent)
    : QDialog(parent), m_queue(queue) {
    setWindowTitle(app::CTarvexDlg::kTitle);
    setWindowIcon(programIcon());
    setWindowFlag(Qt::WindowMinimizeButtonHint);
    applyDialogBackground(*this);
    buildControls();

    m_timer.setTimerType(Qt::CoarseTimer);
    connect(&m_timer, &QTimer::timeout, this,
            [this] { guarded([this] { m_controller->onTimer(); }); });
    m_pump.setInterval(kPumpIntervalMs);
    connect(&m_pump, &QTimer::timeout, this, [this] {
        if (!m_ended) {
            guarded([this] { m_queue.runPending(std::chrono::milliseconds(0)); });
            return;
        }
        // After the end the worker may still hand in notices until it has stopped.
        try {
            m_queue.runPending(std::chrono::milliseconds(0));
        } catch (...) {
        }
    });
    m_pump.start();
}

TarvexWindow::~TarvexWindow() = default;

void TarvexWindow::buildControls() {
    const DialogUnits du(font());
    setFixedSize(du.size(319, 202));

    m_exit = makeButton(*this, du, 1, "E&xit", QRect(216, 113, 96, 26));
    m_exit->setDefault(true);
    m_run = makeButton(*this, du, 1000, "&Run Characterization", QRect(8, 113, 96, 26));
    m_abort = makeButton(*this, du, 1001, "&Abort Cal", QRect(112, 113, 96, 26));
    m_abort->setEnabled(false);
    m_selectAll = makeButton(*this, du, 1002, "&Select All", QRect(216, 50, 96, 26));
    m_clearAll = makeButton(*this, du, 1003, "C&lear All", QRect(216, 81, 96, 26));
    // The unlabeled button exports the stored characterizations.
    m_export = makeButton(*this, du, 1022, "", QRect(199, 7, 7, 16));
    m_export->setToolTip("Export stored characterizations to text files");

    m_log = new QPlainTextEdit(this);
    setControlId(*m_log, 1004);
    m_log->setGeometry(du.rect(7, 147, 305, 48));
    m_log->setReadOnly(true);
    m_log->setLineWrapMode(QPlainTextEdit::NoWrap);
    m_log->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOn);
    m_log->setHorizontalScrollBarPolicy(Qt::ScrollBarAsNeeded);
    m_log->setFrameShape(QFrame::Box);

    m_list = new QListWidget(this);
    setControlId(*m_list, 1005);
    m_list->setGeometry(du.rect(7, 22, 198, 86));
    m_list->setSelectionMode(QAbstractItemView::MultiSelection);
    m_list->setVerticalScrollBarPolicy(Qt::ScrollBarAlwaysOn);
    m_list->setFrameShape(QFrame::Box);

    auto* prompt = new QLabel("Please select the receivers to characterize  ", this);
    prompt->setObjectName("selectPrompt");
    prompt->setGeometry(du.rect(12, 9, 176, 8));

    // Tab order follows the template.
    setTabOrder(m_exit, m_run);
    setTabOrder(m_run, m_abort);
    setTabOrder(m_abort, m_selectAll);
    setTabOrder(m_selectAll, m_clearAll);
    setTabOrder(m_clearAll, m_log);
    setTabOrder(m_log, m_list);
    setTabOrder(m_list, m_export);

    connect(m_exit, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onExit(); }); });
    connect(m_run, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onRun(); }); });
    connect(m_abort, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onAbort(); }); });
    connect(m_selectAll, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onSelectAll(); }); });
    connect(m_clearAll, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onClearAll(); }); });
    connect(m_export, &QPushButton::clicked, this,
            [this] { guarded([this] { m_controller->onExport(); }); });
    connect(m_list, &QListWidget::itemSelectionChanged, this,
            &TarvexWindow::onListSelectionChanged);

    // The system menu: a separator, then the About entry. Desktops without a system menu
    // open it with Alt+Space or a right click on the dialog.
    m_windowMenu = new QMenu(this);
    m_windowMenu->addAction("&Minimize", this, &QWidget::showMinimized);
    m_windowMenu->addAction("&Close", this, &QWidget::close);
    m_windowMenu->addSeparator();
    m_aboutAction = m_windowMenu->addAction("&About Receiver Characterization...");
    connect(m_aboutAction, &QAction::triggered, this,
            [this] { guarded([this] { m_controller->onAbout(); }); });
    auto* menuKey = new QShortcut(QKeySequence(Qt::ALT | Qt::Key_Space), this);
    connect(menuKey, &QShortcut::activated, this,
            [this] { m_windowMenu->popup(mapToGlobal(QPoint(0, 0))); });
}

bool TarvexWindow::guarded(const std::function<void()>& step) {
    if (m_controller == nullptr || m_ended) {
        return true;
    }
    try {
        step();
        return true;
    } catch (const app::ProgramStop& stopRequest) {
        m_stopStatus = stopRequest.status;
    } catch (...) {
        m_failure = platform::currentErrorText();
    }
    stop();
    return false;
}

void TarvexWindow::stop() {
    if (m_ended) {
        return;
    }
    m_ended = true;
    m_timer.stop();
    hide();
    Q_EMIT dialogEnded();
}

void TarvexWindow::onListSelectionChanged() {
    if (m_showingSelection || m_controller == nullptr) {
        return;
    }
    guarded([this] {
        const auto& shown = m_controller->selection();
        for (int i = 0; i < m_list->count(); ++i) {
            const bool selected = m_list->item(i)->isSelected();
            const auto index = static_cast<std::size_t>(i);
            if (index < shown.size() && shown[index] != selected) {
                m_controller->setSelected(index, selected);
            }
        }
    });
}

void TarvexWindow::showReceivers(const std::vector<std::string>& names) {
    m_showingSelection = true;
    m_list->clear();
    for (const auto& name : names) {
        m_list->addItem(QString::fromStdString(name));
    }
    m_showingSelection = false;
}

void TarvexWindow::showSelection(const std::vector<bool>& selected) {
    m_showingSelection = true;
    for (int i = 0; i < m_list->count(); ++i) {
        const auto index = static_cast<std::size_t>(i);
        m_list->item(i)->setSelected(index < selected.size() && selected[index]);
    }
    m_showingSelection = false;
}

void TarvexWindow::appendLog(const std::string& text) {
    QString line = QString::fromStdString(text);
    line.remove('\r');
    QTextCursor cursor = m_log->textCursor();
    cursor.clearSelection();
    cursor.movePosition(QTextCursor::End);
    // insertPlainText keeps the text as given; appendPlainText would add a paragraph.
    m_log->setTextCursor(cursor);
    m_log->insertPlainText(line);
    m_log->ensureCursorVisible();
    if (auto done = m_progress.onNotice(text)) {
        Q_EMIT receiverCompleted(QString::fromStdString(*done));
    }
}

void TarvexWindow::setRunEnabled(bool enabled) {
    m_run->setEnabled(enabled);
}

void TarvexWindow::setAbortEnabled(bool enabled) {
    m_abort->setEnabled(enabled);
}

void TarvexWindow::startTimer(std::chrono::milliseconds period) {
    m_timer.start(static_cast<int>(period.count()));
}

void TarvexWindow::stopTimer() {
    m_timer.stop();
}

void TarvexWindow::showAbout(const app::CAboutDlg& about) {
    QtAboutDialog dialog(about, this);
    dialog.exec();
}

void TarvexWindow::endDialog() {
    stop();
}

void TarvexWindow::showRestartNotice(const std::string& title, const std::string& text) {
    m_restartNotice = std::make_unique<QtRestartDialog>(QString::fromStdString(title),
                                                        QString::fromStdString(text));
    m_restartNotice->show();
    QCoreApplication::processEvents();
}

void TarvexWindow::hideRestartNotice() {
    m_restartNotice.reset();
}

void TarvexWindow::closeEvent(QCloseEvent* event) {
    if (m_ended || m_controller == nullptr) {
        event->accept();
        return;
    }
    // The controller decides: idle ends the dialog, a run is aborted first.
    event->ignore();
    guarded([this] { m_controller->onClose(); });
}

void TarvexWindow::reject() {
    if (m_ended || m_controller == nullptr) {
        QDialog::reject();
        return;
    }
    guarded([this] { m_controller->onClose(); });
}

void TarvexWindow::contextMenuEvent(QContextMenuEvent* event) {
    m_windowMenu->popup(event->globalPos());
}

}  // namespace qtui
