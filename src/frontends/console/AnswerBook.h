#pragma once

// The operator's answers for an unattended run: an answers file of lines
// "CAPTION = ANSWER[, ANSWER...]" (the answers of one caption are used in order, the last
// repeating; "* = ANSWER" answers every other box), or "--yes" (Yes or OK to every box,
// Continue to the bad-data dialog). A box no rule answers gets no answer: never a guess.

#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace console {

// Yes, No, OK, Cancel, Retest, Quit, Continue: the words of the answers file.
enum class AnswerWord { Yes, No, Ok, Cancel, Retest, Quit, Continue };

std::string wordText(AnswerWord word);
// Case-insensitive; nothing for any other word.
std::optional<AnswerWord> parseWord(const std::string& text);

class AnswerBook {
  public:
    // Raises an error text naming the line and what is wrong with it.
    static AnswerBook parse(const std::string& text);
    static AnswerBook yesToAll();

    // The next answer for a box with this caption, when it is one of the allowed words.
    // A rule whose answer is not allowed counts as no answer (reason says why).
    std::optional<AnswerWord> next(const std::string& caption,
                                   const std::vector<AnswerWord>& allowed, std::string& reason);

  private:
    struct Rule {
        std::vector<AnswerWord> answers;
        std::size_t used = 0;
    };
    static AnswerWord take(Rule& rule);

    bool m_yesToAll = false;
    std::map<std::string, Rule> m_rules;
    std::optional<Rule> m_default;
};

}  // namespace console
