#pragma once

// Answers boxes from the answers file and writes each as "[CAPTION] TEXT => ANSWER".

#include <mutex>

#include "frontends/console/BoxAnswerer.h"
#include "frontends/console/ConsoleOutput.h"

namespace console {

class ScriptedAnswerer final : public BoxAnswerer {
  public:
    ScriptedAnswerer(AnswerBook book, ConsoleOutput& output)
        : m_book(std::move(book)), m_output(output) {}

    std::optional<AnswerWord> answer(const BoxQuestion& question, std::string& reason) override;

  private:
    std::mutex m_mutex;
    AnswerBook m_book;
    ConsoleOutput& m_output;
};

}  // namespace console
