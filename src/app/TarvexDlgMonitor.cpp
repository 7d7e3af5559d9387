// Run monitoring: the timer that notices the worker's end, Abort, Close, Exit and the
// deferred second part of a run.

#include <algorithm>

#include "analyzer/NetworkAnalyzerClass.h"
#include "app/CTarvexDlg.h"
#include "engine/RunContext.h"
#include "storage/CatalogFindings.h"

namespace app {

void CTarvexDlg::onAbort() {
    const auto answer = m_services.ui.messageBox(
        {"Are you sure you want to abort?", "Abort now?", platform::Buttons::YesNo,
         platform::BoxSystemModal | platform::BoxOwnedByDialog});
    if (answer == platform::Answer::Yes) {
        std::lock_guard lock(m_noticeLock);
        requestAbort("Abort Requested\r\n");
    }
}

void CTarvexDlg::requestAbort(const std::string& notice) {
    m_services.signals.abortRequested = true;
    setAbortEnabled(false);
    m_notices.postnotice(notice);
}

void CTarvexDlg::onClose() {
    if (!workerRunning()) {
        endDialog();
        return;
    }
    {
        std::lock_guard lock(m_noticeLock);
        requestAbort("Aborting Characterization\r\n");
    }
    m_closeRequested = true;
}

void CTarvexDlg::onExit() {
    if (workerRunning()) {
        requestAbort("Aborting Characterization\r\n");
        m_exitRequested = true;
        return;
    }
    if (!m_services.signals.restartRequested || m_findings.empty()) {
        endDialog();
        return;
    }
    std::string missing;
    for (const auto& [receiver, state] : m_findings) {
        if (state == storage::kCatalogNothing) {
            missing += (missing.empty() ? "" : ", ") + receiver;
        }
    }
    std::string erased;
    for (const auto& receiver : erasedNotStoredAgain()) {
        erased += (erased.empty() ? "" : ", ") + receiver;
    }
    if (!missing.empty() || !erased.empty()) {
        std::string text;
        if (!missing.empty()) {
            text += "You have not successfully calibrated receiver(s): " + missing + "\n";
        }
        if (!erased.empty()) {
            text +=
                "Erased and not characterized again, so the analyzer now holds no "
                "characterization for receiver(s): " +
                erased + " (the log says where their backups are)\n";
        }
        const auto answer = m_services.ui.messageBox(
            {text + "Do you really want to exit now?", "Exit without finishing cal?",
             platform::Buttons::YesNo, platform::BoxSystemModal});
        if (answer != platform::Answer::Yes) {
            return;
        }
    }
    endDialog();
}

std::vector<std::string> CTarvexDlg::erasedNotStoredAgain() {
    std::vector<std::string> erased;
    const auto saved = m_backups.latest();
    for (const auto& receiver : m_receivers) {
        const auto state = m_findings.find(receiver);
        if (state == m_findings.end() || state->second != storage::kCatalogErased) {
            continue;
        }
        erased.push_back(receiver);
        const auto folder = saved.find(receiver);
        m_notices.postnotice("Erased and not characterized again: " + receiver +
                             (folder == saved.end()
                                  ? std::string("; nothing was stored, so there is no backup")
                                  : "; its backup is in " + folder->second.string()) +
                             "\r\n");
    }
    return erased;
}

void CTarvexDlg::onTimer() {
    if (!m_timerRunning) {
        return;
    }
    if (m_services.signals.abortRequested) {
        m_deferred.clear();
    }
    if (workerRunning()) {
        return;
    }
    setRunEnabled(true);
    stopTimer();
    joinWorker();

    // A request is acted on once: a declined exit question must not come back by itself
    // at the end of a later run.
    if (m_exitRequested || m_closeRequested) {
        m_exitRequested = false;
        m_closeRequested = false;
        onExit();
        if (m_ended) {
            return;
        }
    }
    if (m_deferred.empty()) {
        if (!m_services.signals.abortRequested) {
            m_notices.postnotice("All requested cals complete, click Exit to apply.\r\n");
        }
        return;
    }
    startSecondPart();
}

void CTarvexDlg::startSecondPart() {
    m_notices.postnotice("First set of cals complete, will apply the cals to finish.\r\n");
    std::string names;
    for (std::size_t i = 0; i < m_receivers.size(); ++i) {
        m_selected[i] =
            std::find(m_deferred.begin(), m_deferred.end(), m_receivers[i]) != m_deferred.end();
        if (m_selected[i]) {
            names += (names.empty() ? "" : ",") + m_receivers[i];
        }
    }
    m_view.showSelection(m_selected);

    const auto answer = m_services.ui.messageBox(
        {"The cal will automatically reload cals on the TVA before calibrating receiver(s): " +
             names + "\nWould you like to continue?",
         "Reload TVA cals and continue now?", platform::Buttons::YesNo, platform::BoxSystemModal});
    if (answer != platform::Answer::Yes) {
        return;
    }
    reloadFromFlash();
    m_deferred.clear();
    // The reload makes the analyzer application's objects stale: start over with a new proxy.
    m_runContext.reset();
    m_proxy.reset();
    createProxy();
    if (m_quitRequested) {
        return;
    }
    m_proxy->readmodel(true);
    m_proxy->readoptions(true);
    onRun();
}

}  // namespace app
