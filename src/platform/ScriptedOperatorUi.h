#pragma once

// An operator for tests and unattended runs: answers come from rules by caption, every box
// is recorded. A box that no rule answers raises an error text instead of guessing.

#include <deque>
#include <map>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

#include "platform/OperatorUi.h"

namespace platform {

class ScriptedOperatorUi : public OperatorUi {
  public:
    struct Record {
        MessageBox box;
        Answer answer;
    };

    // Answers for one caption, used in order; the last one repeats.
    void answer(const std::string& caption, std::vector<Answer> answers);
    void answerAll(Answer answer);
    void badData(std::vector<BadDataChoice> choices);

    Answer messageBox(const MessageBox& box) override;
    BadDataChoice badDataChoice(const std::string& receiver) override;

    std::vector<Record> boxes() const;
    std::vector<std::string> badDataReceivers() const;
    // Captions of the recorded boxes, in order.
    std::vector<std::string> captions() const;

  private:
    mutable std::mutex m_mutex;
    std::map<std::string, std::deque<Answer>> m_answers;
    std::optional<Answer> m_default;
    std::deque<BadDataChoice> m_badData;
    std::vector<Record> m_boxes;
    std::vector<std::string> m_badDataReceivers;
};

}  // namespace platform
