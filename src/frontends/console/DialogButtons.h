#pragma once

// The dialog's buttons as both console modes press them.

#include <optional>
#include <string>

#include "app/CTarvexDlg.h"
#include "frontends/console/OperatorScript.h"

namespace console {

// Presses the button of a button action (every kind but Select and Wait, which each mode
// does its own way). Returns why nothing was pressed when the button is disabled.
std::optional<std::string> pressButton(app::CTarvexDlg& dlg, ScriptAction::Kind kind);

}  // namespace console
