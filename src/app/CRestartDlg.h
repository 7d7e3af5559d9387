#pragma once

// The notice shown, without blocking, while the analyzer application is being restarted
// after the dialog has ended.

namespace app {

struct CRestartDlg {
    static constexpr const char* kTitle = "Restart";
    static constexpr const char* kText = "Restarting TVA Application";
};

}  // namespace app
