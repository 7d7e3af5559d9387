// rcvrchar gui: the "Receiver Characterization" dialog in a desktop window.

#include "cli/GuiCommand.h"

#include <iostream>
#include <memory>

#if RCVRCHAR_WITH_QT
#include "frontends/qt/QtDialogFrontEnd.h"
#include "platform/RunSignals.h"
#include "sim/SimulatedAnalyzer.h"
#endif

namespace cli {

int runGuiDialog(const AnalyzerOptions& options) {
#if RCVRCHAR_WITH_QT
    // Refuse before the analyzer session changes anything when no window can be opened.
    if (auto reason = qtui::missingDisplay()) {
        std::cerr << "rcvrchar --gui: " << *reason
                  << "; run rcvrchar without --gui for the console front end\n";
        return 1;
    }
    AnalyzerSession session(options);
    // The dialog reads "RcvrChar.dat" and writes its files in the current directory.
    std::filesystem::current_path(session.workingDirectory());
    platform::RunSignals signals;
    qtui::QtSetup setup{
        .clock = session.clock(),
        .paths = session.paths(),
        .processes = session.processes(),
        .signals = signals,
        .workingDirectory = std::filesystem::current_path(),
        .wrapUi = [&session](platform::OperatorUi& frontEnd) { return session.wrapUi(frontEnd); },
        .onWindow = nullptr,
        .instrument = session.identification()};
    return qtui::runQtDialog(setup, std::cerr);
#else
    (void)options;
    std::cerr << "rcvrchar --gui: this build has no desktop front end (built without Qt)\n";
    return 1;
#endif
}

}  // namespace cli
