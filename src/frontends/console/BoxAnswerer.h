#pragma once

// Who answers the boxes of the console front end: the answers file (or --yes), or the
// operator at the terminal.

#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "frontends/console/AnswerBook.h"

namespace console {

struct BoxQuestion {
    BoxQuestion(std::string caption, std::string text, std::vector<AnswerWord> allowed,
                std::string retryOf = {}, AnswerWord retryWord = AnswerWord::Yes,
                AnswerWord stopWord = AnswerWord::No)
        : caption(std::move(caption)),
          text(std::move(text)),
          allowed(std::move(allowed)),
          retryOf(std::move(retryOf)),
          retryWord(retryWord),
          stopWord(stopWord) {}

    std::string caption;
    std::string text;
    std::vector<AnswerWord> allowed;
    // A question that repeats a failed step: the receiver and step, the answer that repeats
    // it and the one that stops repeating.
    std::string retryOf;
    AnswerWord retryWord;
    AnswerWord stopWord;
};

class BoxAnswerer {
  public:
    virtual ~BoxAnswerer() = default;
    // Called from the UI thread or the worker. Nothing, with the reason, when no answer
    // may be given. The answerer shows the question and its answer to the operator.
    virtual std::optional<AnswerWord> answer(const BoxQuestion& question, std::string& reason) = 0;
};

}  // namespace console
