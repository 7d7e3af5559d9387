#pragma once

// The instrument's command tree: header patterns in SCPI notation and their handlers.
// A pattern is colon-separated nodes in long form with the short form in capitals
// ("SENSe#:AVERage:COUNt"); "#" admits a numeric suffix (default 1), "[NODE]" may be
// left out, and a trailing "?" makes it the query form. Keywords match case-insensitively
// in short or long form.

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "scpi/ProgramMessage.h"

namespace scpi {

struct CommandContext {
    ParameterReader& parameters;
    // Numeric suffixes of the "#" nodes, in pattern order.
    std::vector<int> suffixes;
    int suffix(std::size_t index) const { return index < suffixes.size() ? suffixes[index] : 1; }
};

// Returns the reply (empty for commands).
using CommandHandler = std::function<std::string(CommandContext&)>;

class CommandTable {
  public:
    void add(std::string_view pattern, CommandHandler handler);
    // Runs the matching entry; throws Error -113 when no pattern matches.
    std::string dispatch(const CommandHeader& header, ParameterReader& parameters) const;

  private:
    struct Node {
        std::string shortForm;
        std::string longForm;
        bool optional = false;
        bool numbered = false;
    };
    struct Entry {
        std::vector<Node> nodes;
        bool query = false;
        CommandHandler handler;
    };
    static bool matchNodes(const std::vector<Node>& pattern, std::size_t p,
                           const std::vector<std::string_view>& input, std::size_t i,
                           std::vector<int>& suffixes);

    std::vector<Entry> m_entries;
};

}  // namespace scpi
