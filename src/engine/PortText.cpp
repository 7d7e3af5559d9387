#include "engine/PortText.h"

namespace engine {

PortFields parsePortText(const std::string& receiver, const std::string& portText) {
    const auto first = portText.find(',');
    if (first == std::string::npos || first == 0) {
        throw std::string("The port text \"" + portText + "\" of receiver " + receiver +
                          " does not start with a port followed by a comma");
    }
    PortFields fields;
    fields.port = portText.substr(first - 1, 1);
    const auto second = portText.find(',', first + 1);
    fields.ratioParameter = portText.substr(
        first + 1, second == std::string::npos ? std::string::npos : second - first - 1);
    if (second == std::string::npos) {
        return fields;
    }
    const auto third = portText.find(',', second + 1);
    if (third == std::string::npos) {
        fields.destination = portText.substr(second + 1);
    } else {
        fields.destination = portText.substr(second + 1, third - second - 1);
        fields.sweepParameter = portText.substr(third + 1);
    }
    return fields;
}

}  // namespace engine
