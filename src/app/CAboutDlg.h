#pragma once

// The About box, opened from the system menu.

#include <string>

namespace app {

class CAboutDlg {
  public:
    static constexpr const char* kTitle = "About Receiver Characterization";

    // "Receiver Characterization Version 3.0" until initialised, then the product version.
    const std::string& versionText() const { return m_versionText; }
    std::string ownershipText() const;
    void initialize();

  private:
    std::string m_versionText = "Receiver Characterization Version 3.0";
};

}  // namespace app
