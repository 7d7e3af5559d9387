#pragma once

// The operator answers boxes at the terminal. A box of the UI thread is modal: its prompt
// takes the next lines until one is an answer, while the worker's notices keep coming. A
// box of the worker waits for the UI loop to hand it a line (offer), so the operator can
// still type commands such as "abort" meanwhile.

#include <condition_variable>
#include <deque>
#include <mutex>

#include "app/UiTaskQueue.h"
#include "frontends/console/BoxAnswerer.h"
#include "frontends/console/ConsoleOutput.h"
#include "frontends/console/LineSource.h"

namespace console {

class InteractiveAnswerer final : public BoxAnswerer {
  public:
    InteractiveAnswerer(ConsoleOutput& output, app::UiTaskQueue& queue, LineSource& input)
        : m_output(output), m_queue(queue), m_input(input) {}

    std::optional<AnswerWord> answer(const BoxQuestion& question, std::string& reason) override;

    // UI thread: gives the line to the oldest waiting worker box when it is one of its
    // answers; false when the line is not taken.
    bool offer(const std::string& line);
    // UI thread: the input has ended; waiting worker boxes get no answer.
    void inputEnded();
    bool workerBoxWaiting();

  private:
    struct Pending {
        const BoxQuestion* question;
        std::optional<AnswerWord> answer;
        bool settled = false;
    };

    void prompt(const BoxQuestion& question);

    ConsoleOutput& m_output;
    app::UiTaskQueue& m_queue;
    LineSource& m_input;
    std::mutex m_mutex;
    std::condition_variable m_settled;
    std::deque<Pending*> m_pending;
    bool m_inputEnded = false;
};

}  // namespace console
