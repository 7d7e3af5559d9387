#include "scpi/CommandTable.h"

#include <cctype>

namespace scpi {
namespace {}  // namespace

void CommandTable::add(std::string_view pattern, CommandHandler handler) {
    Entry entry;
    if (!pattern.empty() && pattern.back() == '?') {
        entry.query = true;
        pattern.remove_suffix(1);
    }
    std::size_t start = 0;
    for (;;) {
        std::size_t colon = pattern.find(':', start);
        std::string_view text = pattern.substr(
            start, colon == std::string_view::npos ? std::string_view::npos : colon - start);
        Node node;
        if (text.size() > 2 && text.front() == '[' && text.back() == ']') {
            node.optional = true;
            text = text.substr(1, text.size() - 2);
        }
        if (!text.empty() && text.back() == '#') {
            node.numbered = true;
            text.remove_suffix(1);
        }
        for (char c : text) {
            if (!std::islower(static_cast<unsigned char>(c))) {
                node.shortForm += c;
            }
        }
        node.longForm = upperCased(text);
        entry.nodes.push_back(node);
        if (colon == std::string_view::npos) {
            break;
        }
        start = colon + 1;
    }
    entry.handler = std::move(handler);
    m_entries.push_back(std::move(entry));
}

bool CommandTable::matchNodes(const std::vector<Node>& pattern, std::size_t p,
                              const std::vector<std::string_view>& input, std::size_t i,
                              std::vector<int>& suffixes) {
    if (p == pattern.size()) {
        return i == input.size();
    }
    const Node& node = pattern[p];
    std::size_t mark = suffixes.size();
    if (i < input.size()) {
        std::string keyword = upperCased(input[i]);
        int suffix = 1;
        if (node.numbered) {
            std::size_t digits = keyword.size();
            while (digits > 0 && std::isdigit(static_cast<unsigned char>(keyword[digits - 1]))) {
                --digits;
            }
            if (digits < keyword.size()) {
                suffix = std::stoi(keyword.substr(digits, 6));
                keyword.resize(digits);
            }
        }
        if (keyword == node.shortForm || keyword == node.longForm) {
            if (node.numbered) {
                suffixes.push_back(suffix);
            }
            if (matchNodes(pattern, p + 1, input, i + 1, suffixes)) {
                return true;
            }
            suffixes.resize(mark);
        }
    }
    if (node.optional) {
        if (node.numbered) {
            suffixes.push_back(1);
        }
        if (matchNodes(pattern, p + 1, input, i, suffixes)) {
            return true;
        }
        suffixes.resize(mark);
    }
    return false;
}

std::string CommandTable::dispatch(const CommandHeader& header, ParameterReader& parameters) const {
    for (const auto& entry : m_entries) {
        if (entry.query != header.query) {
            continue;
        }
        std::vector<int> suffixes;
        if (matchNodes(entry.nodes, 0, header.nodes, 0, suffixes)) {
            CommandContext context{parameters, std::move(suffixes)};
            return entry.handler(context);
        }
    }
    throw Error{-113, "Undefined header"};
}

}  // namespace scpi
