#include <gtest/gtest.h>

#include "app/CTarvexApp.h"

#include <mutex>
#include <set>
#include <streambuf>
#include <thread>

#include "ConsoleRun.h"

using testsupport::ConsoleRun;
using testsupport::inOrder;

namespace {

// The terminal's text, read by the keyboard while the dialog and its worker write it.
class Screen : public std::streambuf {
  public:
    std::string text() const {
        std::lock_guard lock(m_mutex);
        return m_text;
    }

  protected:
    int_type overflow(int_type c) override {
        if (c != traits_type::eof()) {
            std::lock_guard lock(m_mutex);
            m_text.push_back(traits_type::to_char_type(c));
        }
        return traits_type::not_eof(c);
    }
    std::streamsize xsputn(const char* text, std::streamsize count) override {
        std::lock_guard lock(m_mutex);
        m_text.append(text, static_cast<std::size_t>(count));
        return count;
    }

  private:
    mutable std::mutex m_mutex;
    std::string m_text;
};

// An operator at the terminal: types each line once its cue has appeared (after the
// previous cue), and otherwise answers the newest box still open with its first choice,
// as a person answers the box on top. Gives up after 20 s, as if the input ended.
class Keyboard : public console::LineSource {
  public:
    struct Typed {
        std::string cue;
        std::string line;
    };

    Keyboard(const Screen& screen, std::vector<Typed> lines)
        : m_screen(screen), m_lines(std::move(lines)) {}

    std::optional<std::string> poll(std::chrono::milliseconds timeout) override {
        const std::string text = m_screen.text();
        if (m_next < m_lines.size()) {
            const auto cue = text.find(m_lines[m_next].cue, m_cueFrom);
            if (cue != std::string::npos) {
                m_cueFrom = cue + m_lines[m_next].cue.size();
                return m_lines[m_next++].line;
            }
        }
        if (auto answer = answerNewestBox(text)) {
            return answer;
        }
        std::this_thread::sleep_for(std::min(timeout, std::chrono::milliseconds(5)));
        return std::nullopt;
    }

    bool ended() const override { return std::chrono::steady_clock::now() > m_giveUp; }

  private:
    std::optional<std::string> answerNewestBox(const std::string& text) {
        const std::string marker = "  answer ";
        for (auto at = text.rfind(marker); at != std::string::npos;
             at = at == 0 ? std::string::npos : text.rfind(marker, at - 1)) {
            if (m_answered.insert(at).second) {
                const auto first = at + marker.size();
                return text.substr(first, text.find_first_of("/ ", first) - first);
            }
        }
        return std::nullopt;
    }

    const Screen& m_screen;
    std::vector<Typed> m_lines;
    std::size_t m_next = 0;
    std::size_t m_cueFrom = 0;
    std::set<std::size_t> m_answered;
    std::chrono::steady_clock::time_point m_giveUp =
        std::chrono::steady_clock::now() + std::chrono::seconds(20);
};

struct Session {
    ConsoleRun run;
    Screen screen;
    int status = -1;

    std::string type(std::vector<Keyboard::Typed> lines) {
        Keyboard keyboard(screen, std::move(lines));
        std::ostream out(&screen);
        status = run.runInteractive(keyboard, out);
        return screen.text();
    }
};

}  // namespace

TEST(ThreadedInteractiveConsole, TypedCommandsRunAReceiverWithProgressAndExit) {
    Session session;
    const std::string screen = session.type({{"", "abort"},
                                             {"", "clear"},
                                             {"", "select R1"},
                                             {"", "run"},
                                             {"All requested cals complete", "exit"}});
    EXPECT_EQ(session.status, 0) << session.run.err() << screen;
    EXPECT_TRUE(inOrder(
        screen, {"Commands: run, abort", "the Abort button is disabled when no run is active\n",
                 "Started Cal R1", "[Connections] ", "  answer OK > ", "  => OK\n",
                 "  -- R1: segment 1 of 2, power level 1 of ", "[Connections] ",
                 "  -- R1: segment 2 of 2, power level 1 of ", "Cal Complete",
                 "[Exit without finishing cal?] ", "  => Yes\n"}))
        << screen;
    EXPECT_EQ(screen.find("Started Cal A"), std::string::npos);
    EXPECT_EQ(session.run.transcriptMatching("DIAG:FLASHARRAY \"RcvrChar\",\"R1\"").size(), 1u);
}

TEST(ThreadedInteractiveConsole, AbortTypedWhileAWorkerBoxWaitsEndsTheRunOnceItIsAnswered) {
    Session session;
    const std::string screen = session.type({{"", "clear"},
                                             {"", "select R1"},
                                             {"", "run"},
                                             {"[Connections] ", "abort"},
                                             {"Characterization Aborted", "exit"}});
    EXPECT_EQ(session.status, app::CTarvexApp::exitRunFailed) << session.run.err() << screen;
    // The question about aborting comes while the worker's box is still open; the worker
    // stops as soon as its box is answered, before its first power level.
    EXPECT_TRUE(inOrder(screen, {"[Connections] ", "[Abort now?] ", "  => Yes\n", "  => OK\n",
                                 "Characterization Aborted"}))
        << screen;
    EXPECT_EQ(screen.find("  -- R1:"), std::string::npos);
    EXPECT_TRUE(session.run.transcriptMatching("DIAG:FLASHARRAY \"RcvrChar\",\"R1\"").empty());
}
