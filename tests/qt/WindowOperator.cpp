#include "WindowOperator.h"

#include <gtest/gtest.h>

#include <QAbstractButton>
#include <QApplication>
#include <QPushButton>
#include <cstdlib>
#include <iostream>

#include "frontends/qt/ControlIds.h"
#include "frontends/qt/QtBadDataDialog.h"

namespace qttest {

namespace {
constexpr const char* kHandled = "answeredByTestOperator";
}  // namespace

WindowOperator::WindowOperator(std::chrono::milliseconds limit)
    : m_deadline(std::chrono::steady_clock::now() + limit) {
    m_poll.setInterval(5);
    connect(&m_poll, &QTimer::timeout, this, [this] { poll(); });
}

void WindowOperator::then(std::string what, std::function<bool()> ready,
                          std::function<void()> act) {
    m_steps.push_back({std::move(what), std::move(ready), std::move(act)});
}

void WindowOperator::start() {
    m_poll.start();
}

std::vector<QString> WindowOperator::captions() const {
    std::vector<QString> result;
    for (const auto& box : m_seen) {
        result.push_back(box.caption);
    }
    return result;
}

void WindowOperator::poll() {
    if (std::chrono::steady_clock::now() > m_deadline) {
        giveUp();
    }
    for (QWidget* widget : QApplication::topLevelWidgets()) {
        if (!widget->isVisible() || widget->property(kHandled).toBool()) {
            continue;
        }
        if (auto* box = qobject_cast<QMessageBox*>(widget)) {
            handleBox(*box);
        } else if (qobject_cast<qtui::QtBadDataDialog*>(widget) != nullptr) {
            handleBadData(*widget);
        }
    }
    // A held box is answered once released.
    if (m_held && !m_holding) {
        QMessageBox* box = m_held;
        m_held.clear();
        respond(*box);
    }
    if (!m_steps.empty() && !m_stepPending && m_steps.front().ready()) {
        m_stepPending = true;
        auto act = std::move(m_steps.front().act);
        m_steps.pop_front();
        QTimer::singleShot(0, this, [this, act] {
            m_stepPending = false;
            act();
        });
    }
}

void WindowOperator::handleBox(QMessageBox& box) {
    box.setProperty(kHandled, true);
    m_seen.push_back(
        {box.windowTitle(), box.text(), box.parentWidget() == nullptr && !box.isModal()});
    if (!m_holdCaption.isEmpty() && box.windowTitle() == m_holdCaption) {
        m_held = &box;
        m_holdCaption.clear();
        m_holding = true;
        return;
    }
    respond(box);
}

void WindowOperator::respond(QMessageBox& box) {
    if (!m_defaultAnswers) {
        ADD_FAILURE() << "Unexpected box \"" << box.windowTitle().toStdString()
                      << "\": " << box.text().toStdString();
    }
    const auto chosen =
        box.standardButton(m_defaultAnswers ? box.defaultButton() : box.escapeButton());
    QPointer<QAbstractButton> button = box.button(chosen);
    ASSERT_TRUE(button) << "box \"" << box.windowTitle().toStdString() << "\" has no such button";
    QTimer::singleShot(0, button.data(), [button] { button->click(); });
}

void WindowOperator::handleBadData(QWidget& dialog) {
    dialog.setProperty(kHandled, true);
    m_seen.push_back({dialog.windowTitle(), "", false});
    auto* button = qobject_cast<QAbstractButton*>(qtui::controlById(dialog, m_badDataButton));
    ASSERT_NE(button, nullptr);
    QPointer<QAbstractButton> target = button;
    QTimer::singleShot(0, button, [target] { target->click(); });
}

void WindowOperator::giveUp() {
    std::cerr << "The operator gave up waiting";
    if (!m_steps.empty()) {
        std::cerr << " for: " << m_steps.front().what;
    }
    std::cerr << "\nBoxes seen:\n";
    for (const auto& box : m_seen) {
        std::cerr << "  [" << box.caption.toStdString() << "] " << box.text.toStdString() << "\n";
    }
    // A hung window cannot be unwound from here; end the test program with the report.
    std::_Exit(3);
}

}  // namespace qttest
