#include "frontends/console/DialogButtons.h"

namespace console {

std::optional<std::string> pressButton(app::CTarvexDlg& dlg, ScriptAction::Kind kind) {
    using Kind = ScriptAction::Kind;
    switch (kind) {
        case Kind::SelectAll:
            dlg.onSelectAll();
            break;
        case Kind::Clear:
            dlg.onClearAll();
            break;
        case Kind::Run:
            if (!dlg.runEnabled()) {
                return "the Run button is disabled while a run is active";
            }
            dlg.onRun();
            break;
        case Kind::Export:
            dlg.onExport();
            break;
        case Kind::About:
            dlg.onAbout();
            break;
        case Kind::Abort:
            if (!dlg.abortEnabled()) {
                return "the Abort button is disabled when no run is active";
            }
            dlg.onAbort();
            break;
        case Kind::Exit:
            dlg.onExit();
            break;
        case Kind::Close:
            dlg.onClose();
            break;
        case Kind::Select:
        case Kind::Wait:
            break;
    }
    return std::nullopt;
}

}  // namespace console
