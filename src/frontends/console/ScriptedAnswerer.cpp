#include "frontends/console/ScriptedAnswerer.h"

#include "frontends/console/TextLines.h"

namespace console {

std::optional<AnswerWord> ScriptedAnswerer::answer(const BoxQuestion& question,
                                                   std::string& reason) {
    std::lock_guard lock(m_mutex);
    const std::string shown = "[" + question.caption + "] " + terminalLineEnds(question.text);
    if (!question.retryOf.empty() && m_retries[question.retryOf] >= m_maxRetries) {
        m_output.write(shown + " => " + wordText(question.stopWord) + "\n");
        m_output.write("Unattended: " + question.retryOf + " already repeated " +
                       std::to_string(m_maxRetries) + " times (--max-retries), answered " +
                       wordText(question.stopWord) + "\n");
        return question.stopWord;
    }
    const auto word = m_book.next(question.caption, question.allowed, reason);
    if (word) {
        m_output.write(shown + " => " + wordText(*word) + "\n");
        if (!question.retryOf.empty() && *word == question.retryWord) {
            ++m_retries[question.retryOf];
        }
    }
    return word;
}

}  // namespace console
