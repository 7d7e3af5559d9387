#pragma once

// The "Receiver Characterization" dialog as a Qt window: the controls of its template at
// their positions (dialog units scaled to the font), showing a CTarvexDlg and handing the
// operator's actions to it. Handlers run guarded: an error text that escapes one ends the
// dialog and is kept for the caller to show.

#include <QDialog>
#include <QTimer>
#include <memory>
#include <optional>
#include <string>

#include "app/DialogView.h"
#include "frontends/qt/RunProgressWatcher.h"

class QListWidget;
class QMenu;
class QPlainTextEdit;
class QPushButton;

namespace app {
class CTarvexDlg;
class UiTaskQueue;
}  // namespace app

namespace qtui {

class QtRestartDialog;

class TarvexWindow : public QDialog, public app::DialogView {
    Q_OBJECT
  public:
    // queue is the UI thread's inbox; the window serves it from the Qt event loop.
    explicit TarvexWindow(app::UiTaskQueue& queue, QWidget* parent = nullptr);
    ~TarvexWindow() override;

    // The controller whose handlers the controls call; set before the window is shown.
    void setController(app::CTarvexDlg* controller) { m_controller = controller; }
    app::CTarvexDlg* controller() const { return m_controller; }

    // Runs one controller step; an error text (or a front end's stop) that escapes ends the
    // dialog and is kept. Returns false when the step failed.
    bool guarded(const std::function<void()>& step);
    // The error text that ended the dialog, if one did.
    const std::optional<std::string>& failure() const { return m_failure; }
    // The status of a front end's stop request, if one ended the dialog.
    const std::optional<int>& stopStatus() const { return m_stopStatus; }
    bool ended() const { return m_ended; }

    // The window menu (system menu) with its About entry.
    QMenu& windowMenu() const { return *m_windowMenu; }
    QAction& aboutAction() const { return *m_aboutAction; }
    QTimer& runTimer() { return m_timer; }

    // DialogView.
    void showReceivers(const std::vector<std::string>& names) override;
    void showSelection(const std::vector<bool>& selected) override;
    void appendLog(const std::string& text) override;
    void setRunEnabled(bool enabled) override;
    void setAbortEnabled(bool enabled) override;
    void startTimer(std::chrono::milliseconds period) override;
    void stopTimer() override;
    void showAbout(const app::CAboutDlg& about) override;
    void endDialog() override;
    void showRestartNotice(const std::string& title, const std::string& text) override;
    void hideRestartNotice() override;

  Q_SIGNALS:
    // A receiver's characterization has been stored ("Cal Complete").
    void receiverCompleted(const QString& receiver);
    // The modal run of the dialog has ended.
    void dialogEnded();

  protected:
    void closeEvent(QCloseEvent* event) override;
    void contextMenuEvent(QContextMenuEvent* event) override;
    // Escape is a close request, as on the dialog platform.
    void reject() override;

  private:
    void buildControls();
    void onListSelectionChanged();
    void stop();

    app::UiTaskQueue& m_queue;
    app::CTarvexDlg* m_controller = nullptr;

    QPushButton* m_exit;
    QPushButton* m_run;
    QPushButton* m_abort;
    QPushButton* m_selectAll;
    QPushButton* m_clearAll;
    QPushButton* m_export;
    QPlainTextEdit* m_log;
    QListWidget* m_list;
    QMenu* m_windowMenu;
    QAction* m_aboutAction;

    QTimer m_timer;
    // Serves the UI thread's inbox (the worker's notices) between Qt events.
    QTimer m_pump;
    std::unique_ptr<QtRestartDialog> m_restartNotice;
    RunProgressWatcher m_progress;
    bool m_showingSelection = false;
    bool m_ended = false;
    std::optional<std::string> m_failure;
    std::optional<int> m_stopStatus;
};

}  // namespace qtui
