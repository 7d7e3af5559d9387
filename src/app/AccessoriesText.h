#pragma once

// What the operator must have at hand, posted to the log when the dialog opens.

#include <string>

namespace app {

// The connector of the analyzer's ports, from its model text (first match wins).
std::string connectorType(const std::string& model);

// The accessories notice for the search mode ("Direct-Search" or "Port-Search"), whether
// R-channel receivers must be characterized first, and the pad of "RChannelAtten" in whole
// dB (read only in direct search).
std::string accessoriesText(const std::string& searchMode, bool hasPrerequisites,
                            const std::string& connector, int rChannelPad);

}  // namespace app
