#include "analyzer/remote/MessageQueries.h"

#include "scpi/ProgramMessage.h"

namespace remote {

bool holdsQuery(std::string_view message) {
    for (std::string_view unit : scpi::splitMessageUnits(message)) {
        const auto begin = unit.find_first_not_of(" \t\r\n");
        if (begin == std::string_view::npos) {
            continue;
        }
        const auto end = unit.find_first_of(" \t\r\n", begin);
        if (unit.substr(begin, end - begin).find('?') != std::string_view::npos) {
            return true;
        }
    }
    return false;
}

}  // namespace remote
