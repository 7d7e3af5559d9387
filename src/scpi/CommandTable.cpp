#include "scpi/CommandTable.h"

#include <cctype>

namespace scpi {
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
                              const std::vector<std::string>& input, std::size_t i,
                              std::vector<int>& suffixes) {
    if (p == pattern.size()) {
        return i == input.size();
    }
    const Node& node = pattern[p];
    std::size_t mark = suffixes.size();
    if (i < input.size()) {
        std::string_view keyword = input[i];
        int suffix = 1;
        if (node.numbered) {
            std::size_t digits = keyword.size();
            while (digits > 0 && std::isdigit(static_cast<unsigned char>(keyword[digits - 1]))) {
                --digits;
            }
            if (digits < keyword.size()) {
                suffix = 0;
                for (char c : keyword.substr(digits, 6)) {
                    suffix = suffix * 10 + (c - '0');
                }
                keyword = keyword.substr(0, digits);
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

const CommandTable::Entry* CommandTable::find(const std::vector<std::string>& nodes, bool query,
                                              std::vector<int>& suffixes) const {
    for (const auto& entry : m_entries) {
        if (entry.query != query) {
            continue;
        }
        suffixes.clear();
        if (matchNodes(entry.nodes, 0, nodes, 0, suffixes)) {
            return &entry;
        }
    }
    return nullptr;
}

std::string CommandTable::dispatch(const CommandHeader& header, bool rooted,
                                   std::vector<std::string>& path,
                                   ParameterReader& parameters) const {
    std::vector<std::string> nodes;
    nodes.reserve(path.size() + header.nodes.size());
    const bool common = !header.nodes.empty() && header.nodes.front().starts_with('*');
    if (!rooted && !common) {
        nodes = path;
    }
    for (std::string_view node : header.nodes) {
        nodes.push_back(upperCased(node));
    }
    std::vector<int> suffixes;
    const Entry* entry = find(nodes, header.query, suffixes);
    if (!entry && nodes.size() > header.nodes.size()) {
        nodes.erase(nodes.begin(), nodes.end() - static_cast<long>(header.nodes.size()));
        entry = find(nodes, header.query, suffixes);
    }
    if (!entry) {
        throw Error{-113, "Undefined header"};
    }
    if (!common) {
        nodes.pop_back();
        path = std::move(nodes);
    }
    CommandContext context{parameters, std::move(suffixes)};
    return entry->handler(context);
}

}  // namespace scpi
