#include "app/CAboutDlg.h"

#include <algorithm>

namespace app {

namespace {
// The product version as the version resource spells it.
constexpr const char* kProductVersion = "13,55,06,0";
}  // namespace

std::string CAboutDlg::ownershipText() const {
    return "Copyright (C) Velquor Technologies. All rights reserved.";
}

void CAboutDlg::initialize() {
    std::string version = kProductVersion;
    std::replace(version.begin(), version.end(), ',', '.');
    m_versionText = version;
}

}  // namespace app
