#pragma once

// Follows the run's notices to learn when a receiver's characterization is complete:
// "Started Cal " names the receiver under way, "Cal Complete" ends it.

#include <optional>
#include <string>

namespace qtui {

class RunProgressWatcher {
  public:
    // One notice as posted (with its "\r\n"). Returns the receiver that this notice
    // completed, if any.
    std::optional<std::string> onNotice(const std::string& text);

  private:
    std::string m_current;
};

}  // namespace qtui
