#include "app/CTarvexDlg.h"

#include <algorithm>
#include <chrono>
#include <ctime>

#include "analyzer/NetworkAnalyzerClass.h"
#include "app/AccessoriesText.h"
#include "engine/AttemptHistory.h"
#include "engine/CharacterizationRun.h"
#include "engine/RunContext.h"
#include "platform/ErrorText.h"
#include "storage/EraseCal.h"
#include "storage/ExportCals.h"
#include "storage/FlashCatalog.h"

namespace app {

CTarvexDlg::CTarvexDlg(DialogView& view, DialogServices& services, UiTaskQueue& queue)
    : m_view(view),
      m_services(services),
      m_queue(queue),
      m_notices(queue, [this](const std::string& text) { onNotice(text); }),
      m_flashLog(services.paths),
      m_backups(services.workingDirectory / "backups", services.processes),
      m_writeFailures(services.ui, m_notices) {
    const std::time_t now = std::chrono::system_clock::to_time_t(std::chrono::system_clock::now());
    std::tm local{};
    localtime_r(&now, &local);
    char stamp[32];
    std::strftime(stamp, sizeof stamp, "%Y%m%d-%H%M%S", &local);
    m_historyDirectory = services.workingDirectory / "history" / stamp;
}

CTarvexDlg::~CTarvexDlg() {
    m_services.signals.abortRequested = true;
    joinWorker();
}

void CTarvexDlg::initialize() {
    m_services.signals.abortRequested = false;
    createProxy();
    if (m_quitRequested) {
        return;
    }
    std::string directory = m_proxy->sendscpi("SYST:CONF:DIRectory? APPLICATION");
    directory.erase(std::remove(directory.begin(), directory.end(), '"'), directory.end());
    m_applicationDirectory = directory;

    const std::string model = m_proxy->readmodel(true);
    const std::vector<std::string> options = m_proxy->readoptions(true);
    m_configuration.SetModel(model);
    m_configuration.SetOptions(options);
    // Bare name: the file is the one in the process's current directory.
    m_configuration.ReadSequence("RcvrChar.dat");

    m_searchMode = "Direct-Search";
    fillReceiverList();
    bool portSearch = false;
    m_prerequisites = m_configuration.Prerequisites(m_configuration.RequiredPorts(), portSearch);
    if (portSearch) {
        m_searchMode = "Port-Search";
    }

    storage::catalogFlash(storageContext(), m_services.processes, m_receivers, m_findings);

    m_selected.assign(m_receivers.size(), true);
    m_view.showReceivers(m_receivers);
    m_view.showSelection(m_selected);

    postAccessories();
    // The previous dialog's flash command log goes into this run's history, not away.
    try {
        engine::keepEarlierAttempt(m_services.paths.toLocal(storage::FlashCommandLog::kWindowsPath),
                                   m_historyDirectory);
    } catch (...) {
        m_writeFailures.report(platform::currentErrorText());
    }
    m_flashLog.create();
}

void CTarvexDlg::createProxy() {
    m_proxy = std::make_unique<CNetworkAnalyzer>("", m_services.ui, m_services.clock);
    if (m_proxy->quitRequested()) {
        // "Critical Error" has been shown; nothing can be asked of the analyzer.
        m_quitRequested = true;
        endDialog();
    }
}

void CTarvexDlg::fillReceiverList() {
    m_receivers.clear();
    m_configuration.GetOrder(m_receivers);
    if (m_receivers.empty()) {
        m_receivers = m_configuration.CalibrationsForPorts(m_configuration.RequiredPorts());
    }
}

void CTarvexDlg::postAccessories() {
    const std::string connector = connectorType(m_proxy->readmodel(false));
    int pad = 0;
    const bool portSearch = m_searchMode.find("Port") != std::string::npos;
    if (!portSearch) {
        pad = static_cast<int>(m_configuration.GetConstant("RChannelAtten"));
    }
    m_notices.postnotice(accessoriesText(m_searchMode, !m_prerequisites.empty(), connector, pad));
}

void CTarvexDlg::onNotice(const std::string& text) {
    std::lock_guard lock(m_noticeLock);
    m_logText += text;
    m_view.appendLog(text);
}

void CTarvexDlg::onSelectAll() {
    m_selected.assign(m_receivers.size(), true);
    m_view.showSelection(m_selected);
}

void CTarvexDlg::onClearAll() {
    m_selected.assign(m_receivers.size(), false);
    m_view.showSelection(m_selected);
}

void CTarvexDlg::setSelected(std::size_t index, bool selected) {
    if (index >= m_selected.size()) {
        throw std::string("No receiver at list position " + std::to_string(index) +
                          " (the list has " + std::to_string(m_selected.size()) + ")");
    }
    m_selected[index] = selected;
    m_view.showSelection(m_selected);
}

std::vector<std::string> CTarvexDlg::selectedReceivers() const {
    std::vector<std::string> names;
    for (std::size_t i = 0; i < m_receivers.size(); ++i) {
        if (m_selected[i]) {
            names.push_back(m_receivers[i]);
        }
    }
    return names;
}

void CTarvexDlg::showSelectionOf(const std::vector<std::string>& names) {
    for (std::size_t i = 0; i < m_receivers.size(); ++i) {
        m_selected[i] = std::find(names.begin(), names.end(), m_receivers[i]) != names.end();
    }
    m_view.showSelection(m_selected);
}

void CTarvexDlg::onAbout() {
    CAboutDlg about;
    about.initialize();
    m_view.showAbout(about);
}

void CTarvexDlg::onExport() {
    // The export talks to the analyzer through the proxy, which the worker owns while it runs.
    if (workerRunning() || !m_proxy) {
        return;
    }
    try {
        storage::exportCals(storageContext(), m_receivers, m_findings);
    } catch (...) {
        m_writeFailures.report(platform::currentErrorText());
    }
}

storage::StorageContext CTarvexDlg::storageContext() {
    return {*m_proxy,   m_services.ui, m_services.clock, m_services.paths,
            m_flashLog, &m_backups,    &m_writeFailures};
}

void CTarvexDlg::setRunEnabled(bool enabled) {
    m_runEnabled = enabled;
    m_view.setRunEnabled(enabled);
}

void CTarvexDlg::setAbortEnabled(bool enabled) {
    m_abortEnabled = enabled;
    m_view.setAbortEnabled(enabled);
}

void CTarvexDlg::startTimer() {
    m_timerRunning = true;
    m_view.startTimer(kTimerPeriod);
}

void CTarvexDlg::stopTimer() {
    if (m_timerRunning) {
        m_timerRunning = false;
        m_view.stopTimer();
    }
}

void CTarvexDlg::endDialog() {
    if (m_ended) {
        return;
    }
    stopTimer();
    m_ended = true;
    m_view.endDialog();
}

void CTarvexDlg::shutdown() {
    if (workerRunning() || !m_workerThreadDone) {
        m_services.signals.abortRequested = true;
    }
    joinWorker();
    m_runContext.reset();
    m_proxy.reset();
}

void CTarvexDlg::startWorker(const std::vector<std::string>& receivers) {
    joinWorker();
    m_runContext = std::make_unique<engine::RunContext>(engine::RunContext{
        .proxy = *m_proxy,
        .configuration = m_configuration,
        .receivers = receivers,
        .searchMode = m_searchMode,
        .catalogFindings = m_findings,
        .ui = m_services.ui,
        .clock = m_services.clock,
        .paths = m_services.paths,
        .signals = m_services.signals,
        .notices = m_notices,
        .workingDirectory = m_services.workingDirectory,
        .flashLog = m_flashLog,
        .backups = &m_backups,
        .fileFailures = &m_writeFailures,
        .historyDirectory = m_historyDirectory,
    });
    m_services.signals.workerRunning = true;
    m_workerThreadDone = false;
    m_worker = std::thread([this] {
        int code = 1;
        try {
            code = engine::runCharacterization(*m_runContext);
        } catch (...) {
            // Whatever escaped the run (a front end stopping the program) ends it as failed.
        }
        m_workerExitCode = code;
        if (code != 0) {
            m_anyRunFailed = true;
        }
        m_services.signals.workerRunning = false;
        m_workerThreadDone = true;
        m_queue.wake();
    });
}

void CTarvexDlg::joinWorker() {
    if (!m_worker.joinable()) {
        return;
    }
    // The worker may be waiting for a notice to be appended: keep serving it until it is done.
    while (!m_workerThreadDone) {
        try {
            m_queue.runPending(std::chrono::milliseconds(20));
        } catch (...) {
            // A front end that stops the program says so again from its own loop.
        }
    }
    m_worker.join();
}

}  // namespace app
