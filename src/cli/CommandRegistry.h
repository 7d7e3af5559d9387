#pragma once

// Each subcommand of the executable lives in its own file and registers itself here with a
// static CommandRegistration, so that adding a command touches no other file.

#include <CLI/CLI.hpp>
#include <functional>
#include <string>
#include <vector>

namespace cli {

// Adds the subcommand (or the main command's options) to the app. The returned function
// runs it after parsing and yields the exit status.
using CommandSetup = std::function<std::function<int()>(CLI::App& app)>;

struct CommandEntry {
    std::string name;  // empty: the program without a subcommand (the dialog)
    CommandSetup setup;
};

std::vector<CommandEntry>& commandRegistry();

struct CommandRegistration {
    CommandRegistration(std::string name, CommandSetup setup);
};

}  // namespace cli
