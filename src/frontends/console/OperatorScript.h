#pragma once

// The operator's actions for a run without a terminal, one a line: selectall, clear,
// select NAME[,NAME...], run, wait, export, about, abort, exit, close, and
// "on TEXT: ACTION" (ACTION once, when a notice containing TEXT is appended).
// Blank lines and lines starting with "#" are ignored.

#include <optional>
#include <string>
#include <vector>

namespace console {

struct ScriptAction {
    enum class Kind { SelectAll, Clear, Select, Run, Wait, Export, About, Abort, Exit, Close };
    Kind kind = Kind::Run;
    // Receiver names of "select".
    std::vector<std::string> names;
};

struct ScriptLine {
    int number = 0;
    // Set for "on TEXT: ACTION".
    std::optional<std::string> trigger;
    ScriptAction action;
};

// Raises an error text naming the line and what is wrong with it.
std::vector<ScriptLine> parseOperatorScript(const std::string& text);

// One action without "on"; raises the bare reason when the text is not one.
ScriptAction parseScriptAction(const std::string& text);

// The action as the script spells it (for messages).
std::string actionText(const ScriptAction& action);

}  // namespace console
