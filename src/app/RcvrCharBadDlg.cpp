#include "app/RcvrCharBadDlg.h"

namespace app {

std::string RcvrCharBadDlg::promptText() const {
    return "The characterization data just taken for receiver " + m_receiver +
           " appears to be bad.  Please select an action:";
}

std::string RcvrCharBadDlg::retestLabel() const {
    return "Retest Receiver " + m_receiver;
}

void RcvrCharBadDlg::onRetest(platform::OperatorUi& ui) {
    m_retestChosen = true;
    ui.messageBox(
        {"Before retesting this receiver, please:\n"
         "  1)  Disconnect all current connections\n"
         "  2)  Clean all connections\n"
         "  3)  Verify bulkhead connectors are properly torqued\n"
         "  4)  Ensure cable is of good quality\n"
         "  5)  Torque all connections, including cable, when prompted\n"
         "  6)  As test is running do NOT disturb unit or cable\n"
         "\n"
         "Press OK to continue.",
         "Please Note", platform::Buttons::Ok,
         platform::BoxOwnedByDialog | platform::BoxTopmost | platform::BoxSystemModal});
}

void RcvrCharBadDlg::onDontRetest() {
    m_retestChosen = false;
}

void RcvrCharBadDlg::onQuit() {
    m_quitChosen = true;
}

platform::BadDataChoice RcvrCharBadDlg::choice() const {
    if (m_retestChosen) {
        return platform::BadDataChoice::Retest;
    }
    if (m_quitChosen) {
        return platform::BadDataChoice::Quit;
    }
    return platform::BadDataChoice::Continue;
}

void RcvrCharBadDlg::press(platform::BadDataChoice button, platform::OperatorUi& ui) {
    switch (button) {
        case platform::BadDataChoice::Retest:
            onRetest(ui);
            break;
        case platform::BadDataChoice::Quit:
            onQuit();
            break;
        case platform::BadDataChoice::Continue:
            onDontRetest();
            break;
    }
}

}  // namespace app
