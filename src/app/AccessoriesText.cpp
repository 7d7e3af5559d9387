#include "app/AccessoriesText.h"

#include <array>
#include <utility>

namespace app {

std::string connectorType(const std::string& model) {
    static const std::array<std::pair<const char*, const char*>, 7> kByModel{{
        {"T3871", "3.5mm"},
        {"T3872", "3.5mm"},
        {"T3461", "3.5mm"},
        {"T3462", "3.5mm"},
        {"T3877", "1.85mm"},
        {"T3467", "1.85mm"},
        {"T395", "1.0mm"},
    }};
    for (const auto& [code, connector] : kByModel) {
        if (model.find(code) != std::string::npos) {
            return connector;
        }
    }
    return "2.4mm";
}

std::string accessoriesText(const std::string& searchMode, bool hasPrerequisites,
                            const std::string& connector, int rChannelPad) {
    if (searchMode.find("Port") != std::string::npos) {
        if (hasPrerequisites) {
            return "This Characterization will run in two parts: first R channels, then port "
                   "receivers.\r\nAccessories you will need:\r\n1)  RF cable with " +
                   connector + " connectors (F-F)\r\n2)  " + connector +
                   " pad(s) totalling approximately 20dB\r\n";
        }
        return "For this Characterization you will need:\r\n1)  RF cable with " + connector +
               " connectors (F-F)\r\n ";
    }
    std::string text = "For this Characterization you will need:\r\n1)  RF cable with " +
                       connector + " connectors (F-F or M-F)\r\n2)  " + connector +
                       " adapter (M-M), if using F-F cable\r\n";
    if (rChannelPad != 0) {
        text += "3) Short (4\") flex RF cable with " + connector + " connectors (M-M)\r\n";
        text += "4) " + connector + " " + std::to_string(rChannelPad) + "dB pad\r\n";
    }
    return text;
}

}  // namespace app
