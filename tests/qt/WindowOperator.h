#pragma once

// Plays the operator on the real widgets: answers every message box and bad-data dialog
// that appears (by caption, from a script), and performs a list of steps, each once its
// condition holds. Actions are posted, never run inside the polling timer, so a modal box
// they open does not stop the polling.

#include <QMessageBox>
#include <QObject>
#include <QPointer>
#include <QTimer>
#include <chrono>
#include <deque>
#include <functional>
#include <map>
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

    // Answers for one caption, used in order; the last one repeats.
    void answer(const QString& caption, std::vector<QMessageBox::StandardButton> buttons);
    // Boxes without a rule get their default button (OK, Yes).
    void answerOthersByDefault() { m_defaultAnswers = true; }
    // The bad-data dialog's buttons by control id, in order; the last one repeats.
    void badData(std::vector<int> buttonIds);
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
    std::map<QString, std::deque<QMessageBox::StandardButton>> m_answers;
    std::deque<int> m_badData;
    bool m_defaultAnswers = false;
    QString m_holdCaption;
    QPointer<QMessageBox> m_held;
    bool m_holding = false;
    std::deque<Step> m_steps;
    bool m_stepPending = false;
    std::vector<SeenBox> m_seen;
};

}  // namespace qttest
