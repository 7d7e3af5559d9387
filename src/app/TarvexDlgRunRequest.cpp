// The Run request: the cal-selection rules that turn the list-box selection into a run.

#include <algorithm>
#include <cstdlib>

#include "analyzer/NetworkAnalyzerClass.h"
#include "app/CTarvexDlg.h"
#include "engine/RunContext.h"
#include "platform/ErrorText.h"
#include "storage/DataFile.h"
#include "storage/EraseCal.h"
#include "storage/ExportCals.h"
#include "storage/FlashCatalog.h"
#include "storage/FlashTransfer.h"
#include "storage/PortDataFile.h"
#include "storage/ReceiverNames.h"

namespace app {

namespace {

bool contains(const std::vector<std::string>& list, const std::string& name) {
    return std::find(list.begin(), list.end(), name) != list.end();
}

void appendUnique(std::vector<std::string>& list, const std::string& name) {
    if (!contains(list, name)) {
        list.push_back(name);
    }
}

std::string join(const std::vector<std::string>& names, const std::string& separator) {
    std::string text;
    for (const auto& name : names) {
        if (!text.empty()) {
            text += separator;
        }
        text += name;
    }
    return text;
}

constexpr unsigned kSystemModal = platform::BoxSystemModal;

int stateOf(const storage::CatalogFindings& findings, const std::string& receiver) {
    const auto found = findings.find(receiver);
    return found == findings.end() ? storage::kCatalogNothing : found->second;
}

}  // namespace

struct CTarvexDlg::RunRequest {
    std::vector<std::string> selection;
    std::vector<std::string> eraseList;
    std::vector<std::string> added;
    std::vector<std::string> now;
    std::string deletePrompt;
    std::string adjusted;
    bool stop = false;
    bool oldCalsFound = false;
    bool erased = false;
    bool splitPending = false;
};

void CTarvexDlg::onRun() {
    setRunEnabled(false);
    RunRequest request;
    request.selection = selectedReceivers();
    request.now = request.selection;

    findOldCals(request);
    checkDependencies(request);

    if (!request.added.empty()) {
        for (const auto& name : request.added) {
            appendUnique(request.selection, name);
        }
        showSelectionOf(request.selection);
    }

    if (!request.stop && request.splitPending && !request.now.empty()) {
        for (const auto& name : request.selection) {
            if (!contains(request.now, name)) {
                appendUnique(m_deferred, name);
            }
        }
        request.selection = request.now;
        showSelectionOf(request.selection);
    }

    bool reloadAfterErase = false;
    if (!request.eraseList.empty()) {
        reloadAfterErase = askErase(request);
    }

    if (reloadAfterErase || (request.added.empty() && request.now.empty())) {
        const auto answer = m_services.ui.messageBox(
            {"The cal will automatically reload cal data from flash before calibrating the "
             "selected receiver(s).\nWould you like to continue?",
             "Reload now?", platform::Buttons::YesNo, kSystemModal});
        if (answer == platform::Answer::Yes) {
            reloadFromFlash();
        } else {
            request.stop = true;
        }
    }

    if (request.erased && request.oldCalsFound && m_needsPreparation) {
        m_proxy->preparecal();
        m_needsPreparation = false;
    }

    if (request.stop) {
        if (!request.adjusted.empty()) {
            m_services.ui.messageBox(
                {request.adjusted, "Cal selections adjusted", platform::Buttons::Ok, kSystemModal});
        }
        setRunEnabled(true);
        return;
    }
    startRun(request.selection);
}

std::size_t CTarvexDlg::expectedStoredWords() {
    const int maxBand = static_cast<int>(m_configuration.GetConstant("maxband"));
    std::size_t points = 0;
    for (int band = 0; band <= maxBand; ++band) {
        points += static_cast<std::size_t>(m_configuration.GetBandDefaults(band).m_points);
    }
    return 11 + 28 * points;
}

std::size_t CTarvexDlg::storedWords(const std::string& receiver) {
    if (m_proxy->ismmwave()) {
        const auto file = storage::portDataFile(m_proxy->readmodel(false), receiver);
        const auto bytes = storage::readDataFile(m_services.paths, file.path);
        return bytes ? bytes->size() / 2 : 0;
    }
    const std::string flashName = receiver.find("LOW FREQUENCY EXTENSION") != std::string::npos
                                      ? receiver.substr(0, 2) + "_LFE"
                                      : receiver;
    const std::string reply =
        m_proxy->sendscpi("DIAG:flasharray? \"RCVRCHAR\",\"" + flashName + "\"");
    // The reply's first character is not part of the list.
    const auto fields = reply.empty() ? reply.end() : reply.begin() + 1;
    return static_cast<std::size_t>(std::count(fields, reply.end(), ',')) + 1;
}

void CTarvexDlg::findOldCals(RunRequest& request) {
    const std::size_t expected = expectedStoredWords();
    for (const auto& receiver : m_receivers) {
        const int state = stateOf(m_findings, receiver);
        if (state == storage::kCatalogNothing || state >= storage::kCatalogCharacterized) {
            continue;
        }
        if (storedWords(receiver) == expected) {
            continue;
        }
        if (!contains(request.selection, receiver)) {
            appendUnique(request.added, receiver);
            if (request.adjusted.empty()) {
                request.deletePrompt +=
                    "Due to a change in the calibration points, old cals must be erased.\n";
                request.adjusted +=
                    "Due to a change in the calibration points, all receivers with old cals "
                    "need to be calibrated\nAny old cals not selected have been added to "
                    "selected cals, click 'Run Characterization' again to begin calibration.\n";
            }
            request.stop = true;
        }
        appendUnique(request.eraseList, receiver);
        request.oldCalsFound = true;
    }
}

void CTarvexDlg::checkDependencies(RunRequest& request) {
    static const std::string kPorts = "ABCD";
    for (const auto& receiver : request.selection) {
        const auto index = receiver.empty() ? std::string::npos : kPorts.find(receiver);
        const bool isPort = index != std::string::npos;
        if (isPort && index < m_prerequisites.size()) {
            const std::string& reference = m_prerequisites[index];
            const int referenceState = stateOf(m_findings, reference);
            const bool referenceSelected = contains(request.selection, reference);
            if (referenceState == storage::kCatalogNothing && !referenceSelected) {
                appendUnique(request.added, reference);
                request.adjusted += "There is no cal data saved for receiver '" + reference +
                                    "', upon which the cal for receiver " + receiver +
                                    " depends.\nThe cal has been added to selected cals, click "
                                    "'Run Characterization' again to begin calibration.\n";
                request.stop = true;
            }
            if (referenceSelected || referenceState == storage::kCatalogCharacterized) {
                std::erase(request.now, receiver);
                request.splitPending = true;
            }
        }
        const int state = stateOf(m_findings, receiver);
        if (!m_prerequisites.empty() && isPort && state != storage::kCatalogNothing) {
            request.splitPending = true;
            std::erase(request.now, receiver);
            if (state != storage::kCatalogErased) {
                appendUnique(request.eraseList, receiver);
            }
        }
    }
}

bool CTarvexDlg::askErase(RunRequest& request) {
    request.deletePrompt +=
        "Receiver Characterization must erase the previous cal before calibrating some "
        "receivers.\n\nIs it OK to delete the previous calibrations for receiver(s) " +
        join(request.eraseList, ", ") + "?";
    const auto answer = m_services.ui.messageBox(
        {request.deletePrompt, "Delete previous calibrations?", platform::Buttons::YesNo,
         kSystemModal | platform::BoxOwnedByDialog});
    if (answer != platform::Answer::Yes) {
        request.stop = true;
        return false;
    }
    // Nothing is erased unless all of it is saved first.
    try {
        const auto folder =
            m_backups.save(storageContext(), request.eraseList, storage::BackupReason::Erase);
        if (!folder.empty()) {
            m_notices.postnotice("Backup of the characterizations to be erased saved in " +
                                 folder.string() + "\r\n");
        }
    } catch (...) {
        const std::string text = platform::currentErrorText();
        m_notices.postnotice(text + "\r\n");
        m_services.ui.messageBox(
            {text, "Error", platform::Buttons::Ok, kSystemModal | platform::BoxTopmost});
        request.stop = true;
        return false;
    }
    for (const auto& receiver : request.eraseList) {
        eraseCal(receiver);
    }
    request.erased = true;
    m_services.signals.restartRequested = true;
    return request.oldCalsFound;
}

void CTarvexDlg::startRun(const std::vector<std::string>& receivers) {
    const std::string deferred = join(m_deferred, ",");
    if (!deferred.empty()) {
        m_services.ui.messageBox(
            {"NOTE: The following receivers will be calibrated later, "
             "following a reload of cal data from flash: " +
                 deferred,
             "Some Cals Deferred", platform::Buttons::Ok, kSystemModal});
        m_notices.postnotice("Cal(s) to complete after reload: " + deferred + "\r\n");
    }
    if (m_needsPreparation) {
        m_proxy->preparecal();
        m_needsPreparation = false;
    }
    m_services.signals.restartRequested = true;
    m_services.signals.abortRequested = false;
    setAbortEnabled(true);
    startWorker(receivers);
    startTimer();
}

void CTarvexDlg::reloadFromFlash() {
    storage::reloadFromFlash(storageContext(), m_needsPreparation);
}

void CTarvexDlg::eraseCal(const std::string& receiver) {
    storage::eraseCal(storageContext(), m_services.processes, receiver, m_findings);
}

}  // namespace app
