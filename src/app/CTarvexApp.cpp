#include "app/CTarvexApp.h"

#include "app/CRestartDlg.h"
#include "platform/ErrorText.h"

namespace app {

int CTarvexApp::run(const ModalLoop& modalLoop) {
    CTarvexDlg dlg(m_view, m_services, m_queue);
    int status = 0;
    try {
        try {
            dlg.initialize();
            if (!dlg.ended()) {
                modalLoop(dlg);
            }
            if (dlg.quitRequested()) {
                status = 1;
            }
        } catch (const ProgramStop&) {
            throw;
        } catch (...) {
            status = 1;
            m_services.ui.messageBox({platform::currentErrorText(), "Error", platform::Buttons::Ok,
                                      platform::BoxTopmost | platform::BoxSystemModal});
        }
    } catch (const ProgramStop&) {
        dlg.shutdown();
        throw;
    }
    dlg.shutdown();
    if (status == 0 && (dlg.anyRunFailed() || dlg.anyWriteFailed())) {
        status = exitRunFailed;
    }
    if (m_services.signals.restartRequested) {
        restartAnalyzerApplication(dlg.applicationDirectory());
    }
    return status;
}

std::string CTarvexApp::restartCommandLine(const std::string& applicationDirectory) {
    return "\"" + applicationDirectory + "\\restartapp.exe\"";
}

void CTarvexApp::restartAnalyzerApplication(const std::string& applicationDirectory) {
    if (!m_services.processes.runsPrograms()) {
        m_services.ui.messageBox({CRestartDlg::kByHandText, CRestartDlg::kByHandTitle,
                                  platform::Buttons::Ok, platform::BoxNone});
        return;
    }
    // The notice window goes away however the restart ends.
    struct NoticeWindow {
        DialogView& view;
        explicit NoticeWindow(DialogView& v) : view(v) {
            view.showRestartNotice(CRestartDlg::kTitle, CRestartDlg::kText);
        }
        ~NoticeWindow() { view.hideRestartNotice(); }
    } window(m_view);

    const std::string commandLine = restartCommandLine(applicationDirectory);
    bool started = true;
    try {
        m_services.processes.runProgram(commandLine);
    } catch (...) {
        started = false;
    }
    if (!started) {
        m_services.ui.messageBox({"Error creating process to run: " + commandLine,
                                  CTarvexDlg::kTitle, platform::Buttons::Ok, platform::BoxNone});
    }
}

}  // namespace app
