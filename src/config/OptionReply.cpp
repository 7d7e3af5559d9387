#include "config/OptionReply.h"

std::vector<std::string> SplitOptionReply(const std::string& reply) {
    std::vector<std::string> options;
    std::size_t pos = 0;
    for (std::size_t comma = reply.find(','); comma != std::string::npos;
         comma = reply.find(',', pos)) {
        options.push_back(reply.substr(pos, comma - pos));
        pos = comma + 1;
    }
    std::string rest = reply.substr(pos);
    options.push_back(rest.empty() ? "No Options" : rest);
    return options;
}
