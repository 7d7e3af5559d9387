#pragma once

// Plays the operator on the real widgets: answers every message box (default button) and
// bad-data dialog (scripted) that appears, and performs a list of steps, each once its
// condition holds. Actions are posted, never run inside the polling timer, so a modal box
// they open does not stop the polling.

#include <QMessageBox>
#include <QObject>
#include <QPointer>
#include <QTimer>
#include <chrono>
#include <deque>
#include <functional>
#include <string>
#include <vector>

namespace qttest {

class WindowOperator : public QObject {
  public:
    struct SeenBox {
        QString caption;
        QString text;
        // Shown for the worker: no owner and not modal.
        bool fromWorker = false;
    };

    explicit WindowOperator(std::chrono::milliseconds limit = std::chrono::seconds(30));

    // Boxes get their default button (OK, Yes); without this call a box is a failure.
    void answerBoxesByDefault() { m_defaultAnswers = true; }
    // The bad-data dialog's button to press, by control id ("Don't retest" unless set).
    void badData(int buttonId) { m_badDataButton = buttonId; }
    // Leaves the next box with this caption open until release() is called.
    void hold(const QString& caption) { m_holdCaption = caption; }
    void release() { m_holding = false; }
    // The box now held open, if any.
    QMessageBox* heldBox() const { return m_held.data(); }

    // Acts once ready() holds; steps run in the order given.
    void then(std::string what, std::function<bool()> ready, std::function<void()> act);

    void start();

    const std::vector<SeenBox>& seen() const { return m_seen; }
    std::vector<QString> captions() const;
    bool allStepsDone() const { return m_steps.empty(); }

  private:
    struct Step {
        std::string what;
        std::function<bool()> ready;
        std::function<void()> act;
    };

    void poll();
    void handleBox(QMessageBox& box);
    void respond(QMessageBox& box);
    void handleBadData(QWidget& dialog);
    void giveUp();

    QTimer m_poll;
    std::chrono::steady_clock::time_point m_deadline;
    int m_badDataButton = 1010;
    bool m_defaultAnswers = false;
    QString m_holdCaption;
    QPointer<QMessageBox> m_held;
    bool m_holding = false;
    std::deque<Step> m_steps;
    bool m_stepPending = false;
    std::vector<SeenBox> m_seen;
};

}  // namespace qttest
