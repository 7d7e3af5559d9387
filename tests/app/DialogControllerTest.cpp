#include <gtest/gtest.h>

#include "TempDir.h"
#include "app/CTarvexDlg.h"
#include "platform/ScriptedOperatorUi.h"
#include "sim/Scenario.h"
#include "sim/SimProcessRunner.h"
#include "sim/SimulatedAnalyzer.h"
#include "sim/SimulatedBench.h"

using namespace app;

namespace {

// Records what the dialog shows.
struct FakeView : DialogView {
    std::vector<std::string> items;
    std::vector<bool> selected;
    std::string log;
    bool runEnabled = true;
    bool abortEnabled = false;
    bool timer = false;
    std::vector<std::string> about;
    bool ended = false;

    void showReceivers(const std::vector<std::string>& names) override { items = names; }
    void showSelection(const std::vector<bool>& flags) override { selected = flags; }
    void appendLog(const std::string& text) override { log += text; }
    void setRunEnabled(bool enabled) override { runEnabled = enabled; }
    void setAbortEnabled(bool enabled) override { abortEnabled = enabled; }
    void startTimer(std::chrono::milliseconds period) override {
        EXPECT_EQ(period, std::chrono::milliseconds(1000));
        timer = true;
    }
    void stopTimer() override { timer = false; }
    void showAbout(const CAboutDlg& box) override { about.push_back(box.versionText()); }
    void endDialog() override { ended = true; }
    void showRestartNotice(const std::string&, const std::string&) override {}
    void hideRestartNotice() override {}

    std::vector<std::string> selectedItems() const {
        std::vector<std::string> names;
        for (std::size_t i = 0; i < items.size(); ++i) {
            if (selected[i]) {
                names.push_back(items[i]);
            }
        }
        return names;
    }
};

// A dialog over the fake view, against a fresh simulated analyzer.
class DialogController : public ::testing::Test {
  protected:
    DialogController()
        : m_previous(std::filesystem::current_path()),
          m_clock(std::make_shared<platform::VirtualClock>()),
          m_sim(sim::Scenario::fromJson(R"({"options": "010,080",
                 "app_dir": "\"C:\\Program Files\\Velquor\\NA\""})"),
                m_dir / "analyzer-sim", m_clock),
          m_paths(m_dir.path()),
          m_bench(m_ui, m_sim) {
        std::filesystem::copy_file(testsupport::sampleConfiguration(), m_dir / "RcvrChar.dat");
        std::filesystem::current_path(m_dir.path());
        m_paths.mapDrive('C', m_sim.driveRoot());
        m_processes = std::make_unique<sim::SimProcessRunner>(m_sim, m_paths);
        m_sim.registerAsBackend();
        m_services = std::make_unique<DialogServices>(
            DialogServices{m_bench, *m_clock, m_paths, *m_processes, m_signals, m_dir.path()});
        m_dlg = std::make_unique<CTarvexDlg>(m_view, *m_services, m_queue);
    }
    ~DialogController() override {
        m_dlg.reset();
        std::filesystem::current_path(m_previous);
    }

    // The front end's loop until the dialog is idle again.
    void settle() {
        while (!m_dlg->idle()) {
            m_queue.runPending(std::chrono::milliseconds(10));
            if (m_view.timer && !m_dlg->workerRunning()) {
                m_dlg->onTimer();
            }
        }
    }

    testsupport::TempDir m_dir;
    std::filesystem::path m_previous;
    std::shared_ptr<platform::VirtualClock> m_clock;
    sim::SimulatedAnalyzer m_sim;
    platform::DrivePathMap m_paths;
    platform::ScriptedOperatorUi m_ui;
    sim::SimulatedBench m_bench;
    std::unique_ptr<sim::SimProcessRunner> m_processes;
    platform::RunSignals m_signals;
    std::unique_ptr<DialogServices> m_services;
    FakeView m_view;
    UiTaskQueue m_queue;
    std::unique_ptr<CTarvexDlg> m_dlg;
};

// Runs a worker: also under ThreadSanitizer.
using ThreadedDialogController = DialogController;

}  // namespace

TEST_F(DialogController, InitialisationFillsTheListAllSelectedAndTheButtonsWork) {
    m_dlg->initialize();
    EXPECT_EQ(m_view.items, (std::vector<std::string>{"R1", "R2", "R3", "R4", "A", "B", "C", "D"}));
    EXPECT_EQ(m_view.selectedItems(), m_view.items);
    EXPECT_EQ(m_dlg->searchMode(), "Port-Search");
    EXPECT_EQ(m_dlg->prerequisites(), (std::vector<std::string>{"R1", "R2", "R3", "R4"}));
    EXPECT_EQ(m_dlg->applicationDirectory(), "C:\\Program Files\\Velquor\\NA");
    EXPECT_EQ(m_view.log.rfind("This Characterization will run in two parts", 0), 0u);
    EXPECT_EQ(m_dlg->logText(), m_view.log);
    EXPECT_EQ(testsupport::readFile(m_dir / "FlashCommands.txt"), "Initialized file\r\n");
    EXPECT_TRUE(m_view.runEnabled);
    EXPECT_FALSE(m_view.abortEnabled);
    EXPECT_FALSE(m_view.timer);
    for (const auto& [receiver, state] : m_dlg->catalogFindings()) {
        EXPECT_EQ(state, 0) << receiver;
    }

    m_dlg->onClearAll();
    EXPECT_TRUE(m_view.selectedItems().empty());
    m_dlg->setSelected(4, true);
    EXPECT_EQ(m_view.selectedItems(), (std::vector<std::string>{"A"}));
    m_dlg->onSelectAll();
    EXPECT_EQ(m_view.selectedItems().size(), 8u);
    EXPECT_THROW(m_dlg->setSelected(8, true), std::string);
    m_dlg->onAbout();
    EXPECT_EQ(m_view.about, (std::vector<std::string>{"13.55.06.0"}));

    // Exit before any run: no question, no restart.
    m_dlg->onExit();
    EXPECT_TRUE(m_view.ended);
    EXPECT_FALSE(m_signals.restartRequested);
    EXPECT_TRUE(m_ui.boxes().empty());
}

TEST_F(ThreadedDialogController, RunShowsTheSplitAndTheSecondPartSelectsExactlyTheDeferred) {
    m_ui.answer("Connections", {platform::Answer::Ok});
    m_ui.answer("Some Cals Deferred", {platform::Answer::Ok});
    m_ui.answer("Reload TVA cals and continue now?", {platform::Answer::No});
    m_dlg->initialize();
    m_dlg->onClearAll();
    m_dlg->setSelected(0, true);  // R1
    m_dlg->setSelected(5, true);  // B depends on R2, not selected: added, stop
    m_dlg->setSelected(4, true);  // A depends on R1, selected: deferred

    m_ui.answer("Cal selections adjusted", {platform::Answer::Ok});
    m_dlg->onRun();
    // Stopped: R2 joined the selection, nothing started.
    EXPECT_EQ(m_view.selectedItems(), (std::vector<std::string>{"R1", "R2", "A", "B"}));
    EXPECT_TRUE(m_view.runEnabled);
    EXPECT_FALSE(m_dlg->workerRunning());
    EXPECT_TRUE(m_dlg->deferred().empty());

    m_dlg->onRun();
    EXPECT_EQ(m_view.selectedItems(), (std::vector<std::string>{"R1", "R2"}));
    EXPECT_EQ(m_dlg->deferred(), (std::vector<std::string>{"A", "B"}));
    EXPECT_FALSE(m_view.runEnabled);
    EXPECT_TRUE(m_view.abortEnabled);
    EXPECT_TRUE(m_view.timer);
    EXPECT_TRUE(m_signals.restartRequested);

    settle();
    EXPECT_EQ(m_dlg->lastWorkerExitCode(), 0);
    EXPECT_EQ(m_dlg->catalogFindings().at("R1"), 2);
    EXPECT_EQ(m_dlg->catalogFindings().at("R2"), 2);
    // The second part was declined: only the deferred receivers stay selected.
    EXPECT_EQ(m_view.selectedItems(), (std::vector<std::string>{"A", "B"}));
    EXPECT_EQ(m_ui.captions().back(), "Reload TVA cals and continue now?");
    EXPECT_EQ(m_ui.boxes().back().box.text,
              "The cal will automatically reload cals on the TVA before calibrating receiver(s): "
              "A,B\nWould you like to continue?");
    EXPECT_TRUE(m_view.runEnabled);
    EXPECT_FALSE(m_view.timer);
    EXPECT_EQ(m_view.log.find("All requested cals complete"), std::string::npos);
}
