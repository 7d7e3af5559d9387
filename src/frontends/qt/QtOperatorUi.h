#pragma once

// Message boxes and the bad-data dialog as Qt windows. Construct on the UI thread.
// On the UI thread a box is modal and returns the answer. From any other thread (the
// worker) the box is shown on the UI thread without blocking it (the dialog, Abort
// included, stays usable) and only the calling thread waits for the answer.

#include <QObject>
#include <QPointer>
#include <QWidget>
#include <functional>
#include <map>
#include <mutex>

#include "platform/OperatorUi.h"

class QMessageBox;

namespace qtui {

class QtOperatorUi : public QObject, public platform::OperatorUi {
    Q_OBJECT
  public:
    explicit QtOperatorUi(QObject* parent = nullptr);
    // Releases every thread still waiting, as closeWorkerBoxes does.
    ~QtOperatorUi() override;

    // Owner of the boxes raised on the UI thread when no other window is active.
    void setOwner(QWidget* owner) { m_owner = owner; }

    platform::Answer messageBox(const platform::MessageBox& box) override;
    platform::BadDataChoice badDataChoice(const std::string& receiver) override;

    // UI thread: closes the boxes that other threads wait on and answers them as closing
    // would (No, Cancel, OK; "Don't retest"); boxes asked for later are answered so at once.
    // For the end of the program, when nobody is left to answer.
    void closeWorkerBoxes();
    // Boxes shown for other threads and not yet answered.
    std::size_t openWorkerBoxes() const;

    // The box as a widget, without showing it: caption, plain text, buttons, default and
    // escape buttons, icon, stay-on-top for topmost boxes.
    static std::unique_ptr<QMessageBox> makeBox(const platform::MessageBox& box, QWidget* parent);
    // The answer of a box closed with the given button (none: closed as by Escape).
    static platform::Answer answerOf(const QMessageBox& box, platform::Buttons buttons);

  Q_SIGNALS:
    // A box or bad-data dialog for another thread is now on screen.
    void workerBoxShown(QWidget* box);

  private:
    template <typename T>
    T askFromWorker(std::function<QWidget*(std::function<void(T)>)> show, T closedAnswer);
    bool onUiThread() const;
    QWidget* uiOwner() const;

    QPointer<QWidget> m_owner;
    mutable std::mutex m_mutex;
    bool m_closed = false;
    int m_nextId = 0;
    // Per open worker box: how to release its waiting thread as if it had been closed.
    std::map<int, std::function<void()>> m_release;
    std::map<int, QPointer<QWidget>> m_open;
};

}  // namespace qtui
