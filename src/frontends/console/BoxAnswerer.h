#pragma once

// Who answers the boxes of the console front end: the answers file (or --yes), or the
// operator at the terminal.

#include <optional>
#include <string>
#include <vector>

#include "frontends/console/AnswerBook.h"

namespace console {

struct BoxQuestion {
    std::string caption;
    std::string text;
    std::vector<AnswerWord> allowed;
};

class BoxAnswerer {
  public:
    virtual ~BoxAnswerer() = default;
    // Called from the UI thread or the worker. Nothing, with the reason, when no answer
    // may be given. The answerer shows the question and its answer to the operator.
    virtual std::optional<AnswerWord> answer(const BoxQuestion& question, std::string& reason) = 0;
};

}  // namespace console
