#pragma once

// The "Receiver Characterization" dialog without a toolkit: the receiver list, the log, the
// run rules, run monitoring, abort and exit. A front end shows it through a DialogView and
// calls its handlers on the UI thread (the thread that constructed the UiTaskQueue); the
// characterization itself runs on one worker thread per run.
//
// Handlers raise error texts (std::string or const char*); the application's top level
// (CTarvexApp) ends the dialog with the "Error" box when one escapes.

#include <atomic>
#include <chrono>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "app/DialogNotices.h"
#include "app/DialogServices.h"
#include "app/DialogView.h"
#include "app/UiTaskQueue.h"
#include "app/WriteFailureReport.h"
#include "config/T3872Acomcal.h"
#include "storage/CatalogFindings.h"
#include "storage/FlashCommandLog.h"
#include "storage/StorageContext.h"
#include "storage/StoredBackups.h"

class CNetworkAnalyzer;
namespace engine {
struct RunContext;
}

namespace app {

class CTarvexDlg {
  public:
    static constexpr const char* kTitle = "Receiver Characterization";
    static constexpr std::chrono::milliseconds kTimerPeriod{1000};

    CTarvexDlg(DialogView& view, DialogServices& services, UiTaskQueue& queue);
    // Stops a run that is still going (abort, then waits for the worker) before it goes.
    ~CTarvexDlg();
    CTarvexDlg(const CTarvexDlg&) = delete;
    CTarvexDlg& operator=(const CTarvexDlg&) = delete;

    // Dialog initialisation: proxy, application directory, model and options, "RcvrChar.dat",
    // receiver list, prerequisites and search mode, catalog, list box with every receiver
    // selected, accessories notice, "FlashCommands.txt".
    void initialize();

    // Buttons and window requests.
    void onRun();
    void onAbort();
    void onClose();
    void onExit();
    void onTimer();
    void onSelectAll();
    void onClearAll();
    void onAbout();
    void onExport();
    // The operator (de)selects one list item.
    void setSelected(std::size_t index, bool selected);

    // The notice handler: appends text to the log (UI thread).
    void onNotice(const std::string& text);
    // postnotice for any thread.
    platform::NoticeSink& notices() { return m_notices; }

    // After the modal run: stops a worker that still runs and destroys the proxy.
    void shutdown();

    // What the dialog shows and holds.
    const std::vector<std::string>& receivers() const { return m_receivers; }
    const std::vector<bool>& selection() const { return m_selected; }
    std::vector<std::string> selectedReceivers() const;
    const std::string& logText() const { return m_logText; }
    bool runEnabled() const { return m_runEnabled; }
    bool abortEnabled() const { return m_abortEnabled; }
    bool timerRunning() const { return m_timerRunning; }
    bool workerRunning() const { return m_services.signals.workerRunning.load(); }
    // The modal run has ended (Exit, Close, or the analyzer asked to quit).
    bool ended() const { return m_ended; }
    // The proxy could not reach the analyzer application ("Critical Error" shown).
    bool quitRequested() const { return m_quitRequested; }
    // No worker, no timer, not ended: the operator's turn.
    bool idle() const { return !workerRunning() && !m_timerRunning; }
    const std::string& applicationDirectory() const { return m_applicationDirectory; }
    const std::string& searchMode() const { return m_searchMode; }
    const std::vector<std::string>& prerequisites() const { return m_prerequisites; }
    const std::vector<std::string>& deferred() const { return m_deferred; }
    const storage::CatalogFindings& catalogFindings() const { return m_findings; }
    CNetworkAnalyzer* proxy() const { return m_proxy.get(); }
    // Exit code of the last worker (0 complete, 1 error or abort); -1 before any run.
    int lastWorkerExitCode() const { return m_workerExitCode.load(); }
    // Some run since the dialog opened ended on an error or an abort, so it did not store
    // everything it measured.
    bool anyRunFailed() const { return m_anyRunFailed.load(); }
    // Some file the dialog or a run wrote whole could not be written (reported in the log
    // and an "Error" box).
    bool anyWriteFailed() const { return m_writeFailures.anyFailed(); }
    // Where this dialog keeps backups of what it erases or replaces, and earlier attempts'
    // raw files.
    const storage::StoredBackups& backups() const { return m_backups; }
    const std::filesystem::path& historyDirectory() const { return m_historyDirectory; }

  private:
    struct RunRequest;

    void createProxy();
    void fillReceiverList();
    void postAccessories();
    void showSelectionOf(const std::vector<std::string>& names);
    void setRunEnabled(bool enabled);
    void setAbortEnabled(bool enabled);
    void startTimer();
    void stopTimer();
    void endDialog();
    void requestAbort(const std::string& notice);

    // Run request steps.
    std::size_t expectedStoredWords();
    std::size_t storedWords(const std::string& receiver);
    void findOldCals(RunRequest& request);
    void checkDependencies(RunRequest& request);
    bool askErase(RunRequest& request);
    void startRun(const std::vector<std::string>& receivers);
    void reloadFromFlash();
    void eraseCal(const std::string& receiver);
    void startSecondPart();

    storage::StorageContext storageContext();
    // The receivers erased since start-up and not characterized again, with a log line each
    // saying where its backup is.
    std::vector<std::string> erasedNotStoredAgain();

    void startWorker(const std::vector<std::string>& receivers);
    // Waits for the worker thread to finish, running the UI work it hands in meanwhile.
    void joinWorker();

    DialogView& m_view;
    DialogServices& m_services;
    UiTaskQueue& m_queue;
    DialogNotices m_notices;
    // Serialises log updates and abort requests; Abort posts while holding it.
    std::recursive_mutex m_noticeLock;

    std::vector<std::string> m_receivers;
    std::vector<bool> m_selected;
    std::string m_logText;
    bool m_runEnabled = true;
    bool m_abortEnabled = false;
    bool m_timerRunning = false;
    bool m_ended = false;
    bool m_quitRequested = false;

    CT3872Acomcal m_configuration;
    std::unique_ptr<CNetworkAnalyzer> m_proxy;
    storage::FlashCommandLog m_flashLog;
    std::string m_searchMode;
    storage::CatalogFindings m_findings;
    storage::StoredBackups m_backups;
    WriteFailureReport m_writeFailures;
    std::filesystem::path m_historyDirectory;

    bool m_exitRequested = false;
    bool m_closeRequested = false;
    bool m_needsPreparation = true;
    // Low-frequency receivers would be sized by their own bands; nothing switches it on.
    bool m_lowFrequencyExtension = false;
    std::string m_applicationDirectory = "C:\\Program Files (x86)\\Velquor\\Network Analyzer";
    std::vector<std::string> m_prerequisites;
    std::vector<std::string> m_deferred;

    std::unique_ptr<engine::RunContext> m_runContext;
    std::thread m_worker;
    std::atomic<bool> m_workerThreadDone{true};
    std::atomic<int> m_workerExitCode{-1};
    std::atomic<bool> m_anyRunFailed{false};
};

}  // namespace app
