#include "config/OptionReply.h"

#include "config/Split.h"

std::vector<std::string> SplitOptionReply(const std::string& reply) {
    std::vector<std::string> options = SplitAtCommas(reply);
    if (options.back().empty()) {
        options.back() = "No Options";
    }
    return options;
}
