#pragma once

// Message boxes and the bad-data dialog of the console front end. A box that may not be
// answered stops the program: the caption and text go to stderr, and ProgramStop with
// status 4 is thrown on whichever thread asked (every later box throws it too).

#include <atomic>
#include <functional>

#include "frontends/console/BoxAnswerer.h"
#include "frontends/console/ConsoleOutput.h"
#include "platform/OperatorUi.h"

namespace console {

class ConsoleOperatorUi final : public platform::OperatorUi {
  public:
    static constexpr int kUnansweredStatus = 4;

    // onStop runs once, on the asking thread, when the first box goes unanswered (the front
    // end makes the worker stop and wakes its loop).
    ConsoleOperatorUi(BoxAnswerer& answerer, ConsoleOutput& output, std::function<void()> onStop)
        : m_answerer(answerer), m_output(output), m_onStop(std::move(onStop)) {}

    platform::Answer messageBox(const platform::MessageBox& box) override;
    platform::BadDataChoice badDataChoice(const std::string& receiver) override;

    // A box has gone unanswered: the program is ending with status 4.
    bool stopped() const { return m_stopped.load(); }

    // Asks question and returns the answer, or stops the program (used for the About box).
    AnswerWord ask(const BoxQuestion& question);

  private:
    BoxAnswerer& m_answerer;
    ConsoleOutput& m_output;
    std::function<void()> m_onStop;
    std::atomic<bool> m_stopped{false};
};

}  // namespace console
