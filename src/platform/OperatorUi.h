#pragma once

// Every question the system puts to the operator. Front ends implement it; it may be
// called from the UI thread and from the worker, and a box raised by the worker must not
// block the dialog.

#include <string>
#include <utility>

namespace platform {

enum class Buttons { Ok, OkCancel, YesNo };
enum class Answer { Ok, Cancel, Yes, No };

// Window flags of a box; they change how a desktop shows it, not what it asks.
enum BoxFlags : unsigned {
    BoxNone = 0,
    BoxTopmost = 1u << 0,
    BoxSystemModal = 1u << 1,
    BoxIconInformation = 1u << 2,
    BoxOwnedByDialog = 1u << 3,
};

struct MessageBox {
    MessageBox() = default;
    MessageBox(std::string text, std::string caption, Buttons buttons = Buttons::Ok,
               unsigned flags = BoxNone, std::string retryOf = {})
        : text(std::move(text)),
          caption(std::move(caption)),
          buttons(buttons),
          flags(flags),
          retryOf(std::move(retryOf)) {}

    std::string text;
    std::string caption;
    Buttons buttons = Buttons::Ok;
    unsigned flags = BoxNone;
    // On a question whose Yes repeats a failed step: the receiver and the step ("R2
    // connection"), so that an unattended operator can stop retrying. Empty otherwise.
    std::string retryOf;
};

// The three ways out of the bad-data dialog; closing it counts as Continue.
enum class BadDataChoice { Retest, Quit, Continue };

class OperatorUi {
  public:
    virtual ~OperatorUi() = default;
    virtual Answer messageBox(const MessageBox& box) = 0;
    // Shows the bad-data dialog for one receiver and returns the button pressed
    // (the dialog's own follow-up box, "Please Note", is the caller's to show).
    virtual BadDataChoice badDataChoice(const std::string& receiver) = 0;
};

std::string answerName(Answer answer);

}  // namespace platform
