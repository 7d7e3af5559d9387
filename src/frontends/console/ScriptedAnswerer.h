#pragma once

// Answers boxes from the answers file and writes each as "[CAPTION] TEXT => ANSWER".

#include <map>
#include <mutex>

#include "frontends/console/BoxAnswerer.h"
#include "frontends/console/ConsoleOutput.h"

namespace console {

class ScriptedAnswerer final : public BoxAnswerer {
  public:
    static constexpr int defaultMaxRetries = 3;

    // A step is repeated at most maxRetries times for one receiver; then the answer that
    // stops repeating is given, whatever the book says, so that an unattended run ends.
    ScriptedAnswerer(AnswerBook book, ConsoleOutput& output, int maxRetries = defaultMaxRetries)
        : m_book(std::move(book)), m_output(output), m_maxRetries(maxRetries) {}

    std::optional<AnswerWord> answer(const BoxQuestion& question, std::string& reason) override;

  private:
    std::mutex m_mutex;
    AnswerBook m_book;
    ConsoleOutput& m_output;
    int m_maxRetries;
    std::map<std::string, int> m_retries;
};

}  // namespace console
