#include "app/WriteFailureReport.h"

namespace app {

void WriteFailureReport::report(const std::string& text) {
    m_failed = true;
    m_notices.postnotice("File not written: " + text + "\r\n");
    m_ui.messageBox({text + "\n\nThe characterization stored in the analyzer is not affected.",
                     "Error", platform::Buttons::Ok,
                     platform::BoxSystemModal | platform::BoxTopmost});
}

}  // namespace app
