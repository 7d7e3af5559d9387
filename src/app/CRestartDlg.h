#pragma once

// The notice shown, without blocking, while the analyzer application is being restarted
// after the dialog has ended.

namespace app {

struct CRestartDlg {
    static constexpr const char* kTitle = "Restart";
    static constexpr const char* kText = "Restarting TVA Application";
    // An analyzer on the LAN: its application is restarted by the operator.
    static constexpr const char* kByHandTitle = "Restart the analyzer application";
    static constexpr const char* kByHandText =
        "Restart the analyzer's measurement application so that it loads the new "
        "characterizations.";
};

}  // namespace app
