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
    // Runs the entry that matches the header. A header without a leading colon is first
    // looked up under `path`, the path the previous unit of the message left (IEEE 488.2),
    // then from the root, as clients expect of "FORM:BORD SWAP;FORM REAL,64". On a match
    // `path` becomes the matched header without its last node; common commands ("*...")
    // leave it alone. Throws Error -113 when nothing matches.
    std::string dispatch(const CommandHeader& header, bool rooted, std::vector<std::string>& path,
                         ParameterReader& parameters) const;

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
                           const std::vector<std::string>& input, std::size_t i,
                           std::vector<int>& suffixes);
    const Entry* find(const std::vector<std::string>& nodes, bool query,
                      std::vector<int>& suffixes) const;

    std::vector<Entry> m_entries;
};

}  // namespace scpi
