#include "frontends/console/ScriptedAnswerer.h"

#include "frontends/console/TextLines.h"

namespace console {

std::optional<AnswerWord> ScriptedAnswerer::answer(const BoxQuestion& question,
                                                   std::string& reason) {
    std::lock_guard lock(m_mutex);
    const auto word = m_book.next(question.caption, question.allowed, reason);
    if (word) {
        m_output.write("[" + question.caption + "] " + terminalLineEnds(question.text) + " => " +
                       wordText(*word) + "\n");
    }
    return word;
}

}  // namespace console
