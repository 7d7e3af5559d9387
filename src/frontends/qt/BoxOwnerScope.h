#pragma once

// Names the window that owns the boxes raised on the UI thread while the scope lasts.
// Which window the platform calls active is settled asynchronously (by the window
// manager), so a dialog that raises a box from its own button says so instead.

#include <QPointer>
#include <QWidget>

namespace qtui {

class BoxOwnerScope {
  public:
    explicit BoxOwnerScope(QWidget* owner);
    ~BoxOwnerScope();
    BoxOwnerScope(const BoxOwnerScope&) = delete;
    BoxOwnerScope& operator=(const BoxOwnerScope&) = delete;

    // The owner named by the innermost scope still open, or nullptr.
    static QWidget* current();

  private:
    QPointer<QWidget> m_previous;
};

}  // namespace qtui
