#pragma once

// The dialog in a desktop window, for the main command's --gui.

#include "cli/AnalyzerOptions.h"

namespace cli {

// Exit status as the dialog's: 0 Exit or Close, 1 an error ended it, or no display (the
// reason on standard error), or the program was built without the Qt front end.
int runGuiDialog(const AnalyzerOptions& options);

}  // namespace cli
