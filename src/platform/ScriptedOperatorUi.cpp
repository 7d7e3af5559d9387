#include "platform/ScriptedOperatorUi.h"

namespace platform {

void ScriptedOperatorUi::answer(const std::string& caption, std::vector<Answer> answers) {
    std::lock_guard lock(m_mutex);
    m_answers[caption] = std::deque<Answer>(answers.begin(), answers.end());
}

void ScriptedOperatorUi::answerAll(Answer answer) {
    std::lock_guard lock(m_mutex);
    m_default = answer;
}

void ScriptedOperatorUi::badData(std::vector<BadDataChoice> choices) {
    std::lock_guard lock(m_mutex);
    m_badData = std::deque<BadDataChoice>(choices.begin(), choices.end());
}

Answer ScriptedOperatorUi::messageBox(const MessageBox& box) {
    std::lock_guard lock(m_mutex);
    Answer chosen;
    auto it = m_answers.find(box.caption);
    if (it != m_answers.end() && !it->second.empty()) {
        chosen = it->second.front();
        if (it->second.size() > 1) {
            it->second.pop_front();
        }
    } else if (m_default) {
        chosen = *m_default;
    } else {
        throw std::string("No scripted answer for the box [" + box.caption + "] " + box.text);
    }
    m_boxes.push_back({box, chosen});
    return chosen;
}

BadDataChoice ScriptedOperatorUi::badDataChoice(const std::string& receiver) {
    std::lock_guard lock(m_mutex);
    m_badDataReceivers.push_back(receiver);
    if (m_badData.empty()) {
        return BadDataChoice::Continue;
    }
    BadDataChoice choice = m_badData.front();
    if (m_badData.size() > 1) {
        m_badData.pop_front();
    }
    return choice;
}

std::vector<ScriptedOperatorUi::Record> ScriptedOperatorUi::boxes() const {
    std::lock_guard lock(m_mutex);
    return m_boxes;
}

std::vector<std::string> ScriptedOperatorUi::badDataReceivers() const {
    std::lock_guard lock(m_mutex);
    return m_badDataReceivers;
}

std::vector<std::string> ScriptedOperatorUi::captions() const {
    std::lock_guard lock(m_mutex);
    std::vector<std::string> result;
    for (const auto& record : m_boxes) {
        result.push_back(record.box.caption);
    }
    return result;
}

}  // namespace platform
