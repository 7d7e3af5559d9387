#include "frontends/console/AnswerBook.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <sstream>

#include "frontends/console/TextLines.h"

namespace console {

namespace {

constexpr std::array<std::pair<AnswerWord, const char*>, 7> kWords{{
    {AnswerWord::Yes, "Yes"},
    {AnswerWord::No, "No"},
    {AnswerWord::Ok, "OK"},
    {AnswerWord::Cancel, "Cancel"},
    {AnswerWord::Retest, "Retest"},
    {AnswerWord::Quit, "Quit"},
    {AnswerWord::Continue, "Continue"},
}};

bool allowedWord(AnswerWord word, const std::vector<AnswerWord>& allowed) {
    return std::find(allowed.begin(), allowed.end(), word) != allowed.end();
}

}  // namespace

std::string wordText(AnswerWord word) {
    for (const auto& [candidate, text] : kWords) {
        if (candidate == word) {
            return text;
        }
    }
    return "?";
}

std::optional<AnswerWord> parseWord(const std::string& text) {
    const std::string wanted = upperCase(trim(text));
    for (const auto& [word, spelling] : kWords) {
        if (upperCase(spelling) == wanted) {
            return word;
        }
    }
    return std::nullopt;
}

AnswerBook AnswerBook::parse(const std::string& text) {
    AnswerBook book;
    int number = 0;
    for (const std::string& raw : splitLines(text)) {
        ++number;
        const std::string line = trim(raw);
        if (line.empty() || line.front() == '#') {
            continue;
        }
        const auto place = [&] { return "answers line " + std::to_string(number) + ": "; };
        // Answers never hold "=", captions might: the last one separates them.
        const auto equals = line.rfind('=');
        if (equals == std::string::npos) {
            throw std::string(place() + "expected CAPTION = ANSWER[, ANSWER...], got \"" + line +
                              "\"");
        }
        const std::string caption = trim(line.substr(0, equals));
        Rule rule;
        std::istringstream answers(line.substr(equals + 1));
        std::string item;
        while (std::getline(answers, item, ',')) {
            const auto word = parseWord(item);
            if (!word) {
                throw std::string(place() + "\"" + trim(item) +
                                  "\" is not an answer (Yes, No, OK, Cancel, Retest, Quit, "
                                  "Continue)");
            }
            rule.answers.push_back(*word);
        }
        if (rule.answers.empty()) {
            throw std::string(place() + "no answer given for \"" + caption + "\"");
        }
        if (caption == "*") {
            if (book.m_default) {
                throw std::string(place() + "a second default rule \"* = ...\"");
            }
            book.m_default = std::move(rule);
        } else if (!book.m_rules.emplace(caption, std::move(rule)).second) {
            throw std::string(place() + "a second rule for the caption \"" + caption + "\"");
        }
    }
    return book;
}

AnswerBook AnswerBook::yesToAll() {
    AnswerBook book;
    book.m_yesToAll = true;
    return book;
}

AnswerWord AnswerBook::take(Rule& rule) {
    const AnswerWord word = rule.answers[std::min(rule.used, rule.answers.size() - 1)];
    ++rule.used;
    return word;
}

std::optional<AnswerWord> AnswerBook::next(const std::string& caption,
                                           const std::vector<AnswerWord>& allowed,
                                           std::string& reason) {
    reason.clear();
    if (m_yesToAll) {
        for (AnswerWord word : {AnswerWord::Yes, AnswerWord::Ok, AnswerWord::Continue}) {
            if (allowedWord(word, allowed)) {
                return word;
            }
        }
        reason = "--yes has no answer for this box";
        return std::nullopt;
    }
    Rule* rule = nullptr;
    std::string ruleName;
    if (auto found = m_rules.find(caption); found != m_rules.end()) {
        rule = &found->second;
        ruleName = "the rule for \"" + caption + "\"";
    } else if (m_default) {
        rule = &*m_default;
        ruleName = "the default rule \"*\"";
    } else {
        reason = "no rule answers the caption \"" + caption + "\"";
        return std::nullopt;
    }
    const AnswerWord word = take(*rule);
    if (!allowedWord(word, allowed)) {
        std::string buttons;
        for (AnswerWord button : allowed) {
            buttons += (buttons.empty() ? "" : ", ") + wordText(button);
        }
        reason = ruleName + " answers " + wordText(word) + ", but the box offers " + buttons;
        return std::nullopt;
    }
    return word;
}

}  // namespace console
