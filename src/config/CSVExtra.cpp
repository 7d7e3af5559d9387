#include "config/CSVExtra.h"

#include <algorithm>

#include "config/Split.h"

namespace {

std::string SkipLeadingBlanks(const std::string& text) {
    std::size_t start = text.find_first_not_of(' ');
    return start == std::string::npos ? std::string() : text.substr(start);
}

// Text after the first '=' with leading blanks skipped; empty without '='.
std::string OptionListText(const std::string& heading) {
    std::size_t equals = heading.find('=');
    return equals == std::string::npos ? std::string()
                                       : SkipLeadingBlanks(heading.substr(equals + 1));
}

bool InList(const std::vector<std::string>& words, const std::string& option) {
    return std::find(words.begin(), words.end(), option) != words.end();
}

// "AOPT": some installed option is listed (or only exclusions are given) and no installed
// option is excluded.
bool AnyOptionQualifies(const std::string& heading, const std::vector<std::string>& installed) {
    std::string list = OptionListText(heading);
    std::size_t bang = list.find('!');
    std::vector<std::string> wanted;
    SplitWords(list.substr(0, bang), wanted);
    std::vector<std::string> excluded;
    std::size_t headingBang = heading.find('!');
    if (headingBang != std::string::npos) {
        SplitWords(heading.substr(headingBang + 1), excluded);
    }
    for (const auto& option : installed) {
        if (InList(excluded, option)) {
            return false;
        }
    }
    if (wanted.empty()) {
        return headingBang != std::string::npos;
    }
    return std::any_of(installed.begin(), installed.end(),
                       [&](const std::string& option) { return InList(wanted, option); });
}

// "OOPT": the installed options are exactly those listed.
bool OnlyOptionsQualify(const std::string& heading, const std::vector<std::string>& installed) {
    std::string left = OptionListText(heading);
    for (const auto& option : installed) {
        std::size_t at = left.find(option);
        if (at == std::string::npos) {
            return false;
        }
        std::size_t end = left.find_first_not_of(' ', at + option.size());
        left.erase(at, (end == std::string::npos ? left.size() : end) - at);
    }
    return left.find_first_not_of(' ') == std::string::npos;
}

}  // namespace

void CCSVExtra::SetSelection(const std::vector<std::string>& optionCodes,
                             const std::string& model) {
    m_options = optionCodes;
    m_model = model;
}

int CCSVExtra::SelectColumn(const std::string& blockName,
                            const std::vector<std::string>& partials) {
    const CCSVTable* table = FindTable(blockName);
    if (table == nullptr) {
        throw "Block \"" + blockName + "\" not found for column selection";
    }
    std::string heading = FindSelection(*table, partials, true, true);
    return table->TotalRows() == 0 ? -1 : table->RowAt(0).FindCell(heading, true);
}

std::string CCSVExtra::FindSelection(const CCSVTable& table,
                                     const std::vector<std::string>& partials, bool byColumn,
                                     bool fail) const {
    std::vector<std::string> candidates;
    if (byColumn) {
        table.findColumn(partials, candidates, "ALL");
    } else {
        table.findRow(partials, candidates, "ALL");
    }
    std::string choice = ChooseCandidate(candidates);
    if (choice.empty()) {
        std::string text = byColumn ? "Column" : "Row";
        text += " was not found, Partials searched for";
        for (const auto& partial : partials) {
            text += partial + " and";
        }
        text += " that's it!";
        if (fail) {
            throw text;
        }
    }
    return choice;
}

std::string CCSVExtra::ChooseCandidate(const std::vector<std::string>& candidates) const {
    std::string choice;
    for (const auto& candidate : candidates) {
        bool qualifies;
        if (candidate.find("OOPT") != std::string::npos) {
            qualifies = OnlyOptionsQualify(candidate, m_options);
        } else if (candidate.find("AOPT") != std::string::npos) {
            qualifies = AnyOptionQualifies(candidate, m_options);
        } else {
            qualifies = true;
        }
        if (qualifies) {
            choice = candidate;
        }
    }
    return choice;
}
