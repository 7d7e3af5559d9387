#include <iostream>

#include "cli/CommandRegistry.h"
#include "platform/ErrorText.h"

namespace cli {

std::vector<CommandEntry>& commandRegistry() {
    static std::vector<CommandEntry> entries;
    return entries;
}

CommandRegistration::CommandRegistration(std::string name, CommandSetup setup) {
    commandRegistry().push_back({std::move(name), std::move(setup)});
}

}  // namespace cli

int main(int argc, char** argv) {
    CLI::App app{"rcvrchar: receiver characterization for TVA network analyzers"};
    app.set_version_flag("--version", "rcvrchar 13.55.06.0");
    std::function<int()> mainAction;
    std::vector<std::pair<CLI::App*, std::function<int()>>> subcommands;
    for (auto& entry : cli::commandRegistry()) {
        if (entry.name.empty()) {
            mainAction = entry.setup(app);
        } else {
            subcommands.emplace_back(nullptr, nullptr);
            auto* sub = app.add_subcommand(entry.name);
            subcommands.back() = {sub, entry.setup(*sub)};
        }
    }
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        return app.exit(e);
    }
    try {
        for (auto& [sub, action] : subcommands) {
            if (sub->parsed()) {
                return action();
            }
        }
        if (mainAction) {
            return mainAction();
        }
        std::cout << app.help();
        return 0;
    } catch (...) {
        std::cerr << platform::currentErrorText() << "\n";
        return 1;
    }
}
