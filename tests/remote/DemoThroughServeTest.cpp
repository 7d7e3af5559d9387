// The whole demo against `rcvrchar serve`, over the raw socket and over VXI-11, compared
// with the in-process run: the same flash, the same files, the same messages sent. VXI-11
// clients look for the portmapper on port 111, so that run happens in a network namespace
// the test makes, with only loopback in it.

#include <gtest/gtest.h>
#include <sys/wait.h>

#include <chrono>
#include <cstdlib>
#include <map>
#include <sstream>

#include "RunRcvrchar.h"
#include "TempDir.h"

namespace {

const std::string executable = RCVRCHAR_BINARY_DIR "/bin/rcvrchar";
const std::string scenario = RCVRCHAR_SOURCE_DIR "/data/scenarios/default.json";

const char* const demoScript = "selectall\nrun\nwait\n";
const char* const demoAnswers =
    "Connections = OK\nSome Cals Deferred = OK\nReload TVA cals and continue now? = Yes\n"
    "Reload now? = Yes\nDelete previous calibrations? = Yes\nCal selections adjusted = OK\n"
    "Check Connection = Yes\nCharacterization data issue! = Retest\nPlease Note = OK\n"
    "Restart the analyzer application = OK\n";

// Serves a simulator, runs the demo through the resource string it announces, stops it.
// $1: SOCKET or INSTR, $2: the run's folder.
const std::string runScript =
    "kind=$1 run=$2\n"
    "if [ $kind = INSTR ]; then ip link set lo up || exit 90; vxi=--vxi11; else vxi=; fi\n"
    "'" +
    executable + "' serve --port 0 $vxi --scenario '" + scenario +
    "' --sim-state $run-state --trace $run-served.txt > $run-serve.txt 2>&1 &\n"
    "server=$!\n"
    "for i in $(seq 300); do grep -qs \"::$kind\" $run-serve.txt && break; sleep 0.1; done\n"
    "resource=$(grep -o \"^TCPIP::[^ ]*::$kind\" $run-serve.txt)\n"
    "started=$(date +%s%N)\n"
    "'" +
    executable +
    "' --workdir $run --analyzer \"$resource\" --clock virtual --timeout 20 "
    "--script operator.script --answers answers.txt --trace $run-trace.txt "
    "> $run-out.txt 2> $run-err.txt\n"
    "status=$?\n"
    "echo $(( ($(date +%s%N) - started) / 1000000 )) > $run-ms.txt\n"
    "kill -TERM $server; wait $server || status=92\n"
    "exit $status\n";

std::map<std::string, std::string> filesUnder(const std::filesystem::path& root) {
    std::map<std::string, std::string> files;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root)) {
        if (entry.is_regular_file()) {
            files[std::filesystem::relative(entry.path(), root).string()] =
                testsupport::readFile(entry.path());
        }
    }
    return files;
}

// Names whose contents differ, or that only one side has.
std::vector<std::string> differences(const std::map<std::string, std::string>& actual,
                                     const std::map<std::string, std::string>& expected) {
    std::vector<std::string> names;
    for (const auto& [name, bytes] : expected) {
        const auto found = actual.find(name);
        if (found == actual.end() || found->second != bytes) {
            names.push_back(name);
        }
    }
    for (const auto& [name, bytes] : actual) {
        if (!expected.contains(name)) {
            names.push_back(name + " (extra)");
        }
    }
    return names;
}

// The messages a trace shows sent ("> " lines) as far as both traces keep long ones. With
// `bySystem`, without the data format the back end sets on each connection and its
// identification probe, which no step of the system asks for.
std::vector<std::string> sentMessages(const std::string& trace, bool bySystem) {
    constexpr std::size_t kept = 4000;
    std::vector<std::string> sent;
    std::istringstream lines(trace);
    for (std::string line; std::getline(lines, line);) {
        if (line.rfind("> ", 0) != 0) {
            continue;
        }
        line = line.substr(2, kept);
        if (bySystem &&
            (line == ":FORM:BORD NORM;:FORM:DATA REAL,32" || line == "SIM:VERS?;*IDN?")) {
            continue;
        }
        sent.push_back(line);
    }
    return sent;
}

class DemoThroughServe : public ::testing::Test {
  protected:
    static void SetUpTestSuite() {
        s_dir = new testsupport::TempDir;
        auto& dir = *s_dir;
        for (const char* folder :
             {"local", "local2", "local3", "SOCKET", "SOCKET2", "SOCKET3", "INSTR"}) {
            std::filesystem::create_directories(dir / folder);
            std::filesystem::copy_file(testsupport::sampleConfiguration(),
                                       dir / folder / "RcvrChar.dat");
        }
        testsupport::writeFile(dir / "operator.script", demoScript);
        testsupport::writeFile(dir / "answers.txt", demoAnswers);
        testsupport::writeFile(dir / "run.sh", runScript);
        s_local = new clitest::CommandRun(runLocal("local"));
    }
    static clitest::CommandRun runLocal(const std::string& folder) {
        clitest::CommandRun run = clitest::runRcvrchar(
            *s_dir, "--workdir " + folder + " --analyzer 'sim:" + scenario + "' --sim-state " +
                        folder + "-state --trace " + folder +
                        "-trace.txt --script operator.script --answers answers.txt");
        return run;
    }
    static void TearDownTestSuite() {
        delete s_local;
        delete s_dir;
    }

    // Runs the demo over the link and compares what it stored and sent with the in-process
    // run's.
    void expectTheInProcessResults(const std::string& kind, const std::string& prefix) {
        ASSERT_EQ(s_local->status, 0) << s_local->err;
        auto& dir = *s_dir;
        const std::string out = testsupport::readFile(dir / (kind + "-out.txt"));
        EXPECT_EQ(out.rfind("Analyzer: Velquor Technologies,T3872A,", 0), 0u) << out;
        auto completed = [](const std::string& text) {
            std::size_t count = 0;
            for (auto at = text.find("\nCal Complete"); at != std::string::npos;
                 at = text.find("\nCal Complete", at + 1)) {
                ++count;
            }
            return count;
        };
        EXPECT_EQ(completed(out), 8u) << out;
        EXPECT_EQ(completed(out), completed(s_local->out));
        // A restart program cannot run on the analyzer computer from here: the operator does it.
        EXPECT_NE(out.find("[Restart the analyzer application] Restart the analyzer's "
                           "measurement application so that it loads the new "
                           "characterizations. => OK"),
                  std::string::npos)
            << out;
        EXPECT_EQ(out.find("[Restart] Restarting TVA Application"), std::string::npos);
        EXPECT_NE(s_local->out.find("[Restart] Restarting TVA Application"), std::string::npos);

        EXPECT_EQ(differences(filesUnder(dir / (kind + "-state") / "flash"),
                              filesUnder(dir / "local-state" / "flash")),
                  std::vector<std::string>{});
        EXPECT_EQ(differences(filesUnder(dir / kind), filesUnder(dir / "local")),
                  std::vector<std::string>{});

        // Every message the system sends through its SCPI pass-through in-process goes out,
        // in order, among those the back end makes of the automation calls.
        const std::string trace = testsupport::readFile(dir / (kind + "-trace.txt"));
        // What the client sent is what the served instrument ran.
        const auto received =
            sentMessages(testsupport::readFile(dir / (kind + "-served.txt")), false);
        EXPECT_GT(received.size(), 1000u);
        EXPECT_TRUE(sentMessages(trace, false) == received) << "messages changed over " << prefix;
        const auto local = sentMessages(testsupport::readFile(dir / "local-trace.txt"), true);
        const auto lan = sentMessages(trace, true);
        std::size_t at = 0;
        for (const auto& message : local) {
            while (at < lan.size() && lan[at] != message) {
                ++at;
            }
            ASSERT_LT(at, lan.size()) << "not sent over " << prefix << ": " << message;
            ++at;
        }
    }

    static testsupport::TempDir* s_dir;
    static clitest::CommandRun* s_local;
};

testsupport::TempDir* DemoThroughServe::s_dir = nullptr;
clitest::CommandRun* DemoThroughServe::s_local = nullptr;

int shell(const testsupport::TempDir& dir, const std::string& command) {
    const int status = std::system(("cd '" + dir.path().string() + "' && " + command).c_str());
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

}  // namespace

TEST_F(DemoThroughServe, OverTheRawSocketItStoresAndSendsWhatTheInProcessRunDoes) {
    auto& dir = *s_dir;
    ASSERT_EQ(shell(dir, "sh run.sh SOCKET SOCKET"), 0)
        << testsupport::readFile(dir / "SOCKET-err.txt")
        << testsupport::readFile(dir / "SOCKET-serve.txt");
    expectTheInProcessResults("SOCKET", "the raw socket");
}

TEST_F(DemoThroughServe, OverVxi11ItStoresAndSendsWhatTheRawSocketRunDoes) {
    auto& dir = *s_dir;
    if (shell(dir, "unshare -n true 2> /dev/null") != 0) {
        GTEST_SKIP() << "unshare -n is not permitted here: the VXI-11 demo needs a network "
                        "namespace of its own for the portmapper's port 111";
    }
    ASSERT_EQ(shell(dir, "unshare -n sh run.sh INSTR INSTR"), 0)
        << testsupport::readFile(dir / "INSTR-err.txt")
        << testsupport::readFile(dir / "INSTR-serve.txt");
    expectTheInProcessResults("INSTR", "VXI-11");
    std::printf("demo wall time through rcvrchar serve's VXI-11: %s ms\n",
                testsupport::readFile(dir / "INSTR-ms.txt").c_str());
}
