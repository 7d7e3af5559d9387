#include "frontends/console/InteractiveAnswerer.h"

#include <algorithm>

#include "frontends/console/TextLines.h"

namespace console {

namespace {

std::string choices(const std::vector<AnswerWord>& allowed) {
    std::string text;
    for (AnswerWord word : allowed) {
        text += (text.empty() ? "" : "/") + wordText(word);
    }
    return text;
}

std::optional<AnswerWord> fitting(const std::string& line, const std::vector<AnswerWord>& allowed) {
    const auto word = parseWord(line);
    if (word && std::find(allowed.begin(), allowed.end(), *word) != allowed.end()) {
        return word;
    }
    return std::nullopt;
}

}  // namespace

void InteractiveAnswerer::prompt(const BoxQuestion& question) {
    m_output.write("\n[" + question.caption + "] " + terminalLineEnds(question.text) +
                   "\n  answer " + choices(question.allowed) + " > ");
}

std::optional<AnswerWord> InteractiveAnswerer::answer(const BoxQuestion& question,
                                                      std::string& reason) {
    if (!m_queue.onUiThread()) {
        Pending pending{&question, std::nullopt};
        std::unique_lock lock(m_mutex);
        if (m_inputEnded) {
            reason = "the input has ended";
            return std::nullopt;
        }
        prompt(question);
        m_pending.push_back(&pending);
        m_queue.wake();
        m_settled.wait(lock, [&] { return pending.settled; });
        if (!pending.answer) {
            reason = "the input has ended";
        }
        return pending.answer;
    }
    prompt(question);
    for (;;) {
        // The worker's notices keep flowing while the operator thinks.
        m_queue.runPending(std::chrono::milliseconds(0));
        if (auto line = m_input.poll(std::chrono::milliseconds(50))) {
            if (auto word = fitting(*line, question.allowed)) {
                m_output.write("  => " + wordText(*word) + "\n");
                return word;
            }
            m_output.write("  answer " + choices(question.allowed) + " > ");
        } else if (m_input.ended()) {
            reason = "the input has ended";
            return std::nullopt;
        }
    }
}

bool InteractiveAnswerer::offer(const std::string& line) {
    std::lock_guard lock(m_mutex);
    if (m_pending.empty()) {
        return false;
    }
    Pending* oldest = m_pending.front();
    const auto word = fitting(line, oldest->question->allowed);
    if (!word) {
        return false;
    }
    m_output.write("  => " + wordText(*word) + "\n");
    oldest->answer = word;
    oldest->settled = true;
    m_pending.pop_front();
    m_settled.notify_all();
    return true;
}

void InteractiveAnswerer::inputEnded() {
    std::lock_guard lock(m_mutex);
    m_inputEnded = true;
    for (Pending* pending : m_pending) {
        pending->settled = true;
    }
    m_pending.clear();
    m_settled.notify_all();
}

bool InteractiveAnswerer::workerBoxWaiting() {
    std::lock_guard lock(m_mutex);
    return !m_pending.empty();
}

}  // namespace console
