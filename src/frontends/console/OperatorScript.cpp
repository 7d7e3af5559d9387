#include "frontends/console/OperatorScript.h"

#include <array>
#include <sstream>

#include "frontends/console/TextLines.h"

namespace console {

namespace {

using Kind = ScriptAction::Kind;

constexpr std::array<std::pair<Kind, const char*>, 10> kKeywords{{
    {Kind::SelectAll, "selectall"},
    {Kind::Clear, "clear"},
    {Kind::Select, "select"},
    {Kind::Run, "run"},
    {Kind::Wait, "wait"},
    {Kind::Export, "export"},
    {Kind::About, "about"},
    {Kind::Abort, "abort"},
    {Kind::Exit, "exit"},
    {Kind::Close, "close"},
}};

}  // namespace

ScriptAction parseScriptAction(const std::string& text) {
    const std::string line = trim(text);
    const auto space = line.find_first_of(" \t");
    const std::string keyword = line.substr(0, space);
    const std::string rest = space == std::string::npos ? "" : trim(line.substr(space));
    for (const auto& [kind, spelling] : kKeywords) {
        if (keyword != spelling) {
            continue;
        }
        ScriptAction action;
        action.kind = kind;
        if (kind == Kind::Select) {
            std::istringstream names(rest);
            std::string name;
            while (std::getline(names, name, ',')) {
                if (trim(name).empty()) {
                    throw std::string("select needs receiver names separated by commas");
                }
                action.names.push_back(trim(name));
            }
            if (action.names.empty()) {
                throw std::string("select needs at least one receiver name");
            }
        } else if (!rest.empty()) {
            throw std::string(std::string(spelling) + " takes no argument, got \"" + rest + "\"");
        }
        return action;
    }
    throw std::string("unknown action \"" + keyword +
                      "\" (selectall, clear, select, run, wait, export, about, abort, exit, "
                      "close, on)");
}

std::vector<ScriptLine> parseOperatorScript(const std::string& text) {
    std::vector<ScriptLine> script;
    int number = 0;
    for (const std::string& raw : splitLines(text)) {
        ++number;
        const std::string line = trim(raw);
        if (line.empty() || line.front() == '#') {
            continue;
        }
        ScriptLine entry;
        entry.number = number;
        try {
            if (line.rfind("on ", 0) == 0 || line.rfind("on\t", 0) == 0) {
                // Receiver names hold no ":", notices may: the last one ends the text.
                const auto colon = line.rfind(':');
                if (colon == std::string::npos) {
                    throw std::string("expected on TEXT: ACTION");
                }
                const std::string trigger = trim(line.substr(3, colon - 3));
                if (trigger.empty()) {
                    throw std::string("on needs the text of a notice before \":\"");
                }
                entry.trigger = trigger;
                entry.action = parseScriptAction(line.substr(colon + 1));
                // The worker waits while the action runs; waiting for it would never end.
                if (entry.action.kind == Kind::Wait) {
                    throw std::string("wait cannot be the action of on");
                }
            } else {
                entry.action = parseScriptAction(line);
            }
        } catch (const std::string& reason) {
            throw std::string("script line " + std::to_string(number) + ": " + reason);
        }
        script.push_back(std::move(entry));
    }
    return script;
}

std::string actionText(const ScriptAction& action) {
    for (const auto& [kind, spelling] : kKeywords) {
        if (kind != action.kind) {
            continue;
        }
        std::string text = spelling;
        for (std::size_t i = 0; i < action.names.size(); ++i) {
            text += (i == 0 ? " " : ",") + action.names[i];
        }
        return text;
    }
    return "?";
}

}  // namespace console
