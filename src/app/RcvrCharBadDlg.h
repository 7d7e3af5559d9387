#pragma once

// The bad-data dialog: result processing asks through it what to do with a receiver whose
// fresh characterization fails the acceptance criteria. A front end shows the title, the
// prompt and the three button labels, and calls the handler of the button pressed
// (closing the window counts as "Don't retest").

#include <string>

#include "platform/OperatorUi.h"

namespace app {

class RcvrCharBadDlg {
  public:
    static constexpr const char* kTitle = "Characterization data issue!";
    static constexpr const char* kDontRetestLabel =
        "Don't retest, continue with remaining receivers.";
    static constexpr const char* kQuitLabel = "Quit";

    explicit RcvrCharBadDlg(std::string receiver) : m_receiver(std::move(receiver)) {}

    const std::string& receiver() const { return m_receiver; }
    std::string promptText() const;
    std::string retestLabel() const;

    // The retest button also shows the "Please Note" box (through ui) before the dialog ends.
    void onRetest(platform::OperatorUi& ui);
    void onDontRetest();
    void onQuit();

    bool retestChosen() const { return m_retestChosen; }
    bool quitChosen() const { return m_quitChosen; }
    // Neither flag set means "Don't retest".
    platform::BadDataChoice choice() const;

    // Shows the dialog's choice as a front end presented it: runs the handler of the button.
    void press(platform::BadDataChoice button, platform::OperatorUi& ui);

  private:
    bool m_retestChosen = false;
    bool m_quitChosen = false;
    std::string m_receiver;
};

}  // namespace app
