// The executable against a simulated analyzer served on a loopback raw socket, as
// `rcvrchar serve` serves it: what the operator sees, and what the instrument holds after.

#include <gtest/gtest.h>

#include <map>

#include "RunRcvrchar.h"
#include "TempDir.h"
#include "lan/RawSocketServer.h"
#include "lan/ServerContext.h"
#include "sim/Scenario.h"
#include "sim/SimulatedAnalyzer.h"

namespace {

const std::string defaultScenario = RCVRCHAR_SOURCE_DIR "/data/scenarios/default.json";

// The demo's operator: every receiver, the deferred second part, reloads and erasing.
const char* const demoScript = "selectall\nrun\nwait\n";
const char* const demoAnswers =
    "Connections = OK\nSome Cals Deferred = OK\nReload TVA cals and continue now? = Yes\n"
    "Reload now? = Yes\nDelete previous calibrations? = Yes\nCal selections adjusted = OK\n"
    "Check Connection = Yes\nCharacterization data issue! = Retest\nPlease Note = OK\n"
    "Restart the analyzer application = OK\n";

struct ServedSimulator {
    ServedSimulator(const std::filesystem::path& state, const std::string& scenario)
        : analyzer(sim::Scenario::fromFile(scenario), state),
          device(analyzer.scpiDevice()),
          server(context, *device, {asio::ip::make_address("127.0.0.1"), 0}) {}
    ~ServedSimulator() { context.stop(); }

    std::string resource() const {
        return "TCPIP::127.0.0.1::" + std::to_string(server.port()) + "::SOCKET";
    }

    lan::ServerContext context;
    sim::SimulatedAnalyzer analyzer;
    std::unique_ptr<scpi::Device> device;
    lan::RawSocketServer server;
};

std::map<std::string, std::string> filesUnder(const std::filesystem::path& root,
                                              const std::string& skip = "") {
    std::map<std::string, std::string> files;
    for (auto it = std::filesystem::recursive_directory_iterator(root);
         it != std::filesystem::recursive_directory_iterator(); ++it) {
        if (!skip.empty() && it->path().filename() == skip) {
            it.disable_recursion_pending();
            continue;
        }
        if (it->is_regular_file()) {
            files[std::filesystem::relative(it->path(), root).string()] =
                testsupport::readFile(it->path());
        }
    }
    return files;
}

void expectSameFiles(const std::map<std::string, std::string>& actual,
                     const std::map<std::string, std::string>& expected) {
    std::vector<std::string> actualNames, expectedNames;
    for (const auto& [name, bytes] : actual) {
        actualNames.push_back(name);
    }
    for (const auto& [name, bytes] : expected) {
        expectedNames.push_back(name);
    }
    ASSERT_EQ(actualNames, expectedNames);
    for (const auto& [name, bytes] : expected) {
        EXPECT_TRUE(actual.at(name) == bytes) << name << " differs";
    }
}

class OverTheRawSocket : public ::testing::Test {
  protected:
    void SetUp() override {
        for (const char* folder : {"local", "lan"}) {
            std::filesystem::create_directories(m_dir / folder);
            std::filesystem::copy_file(testsupport::sampleConfiguration(),
                                       m_dir / folder / "RcvrChar.dat");
        }
        testsupport::writeFile(m_dir / "operator.script", demoScript);
        testsupport::writeFile(m_dir / "answers.txt", demoAnswers);
    }
    testsupport::TempDir m_dir;
};

}  // namespace

TEST_F(OverTheRawSocket, TheDemoStoresWhatTheInProcessDemoStores) {
    const auto started = std::chrono::steady_clock::now();
    const clitest::CommandRun local = clitest::runRcvrchar(
        m_dir, "--workdir local --analyzer 'sim:" + defaultScenario +
                   "' --sim-state local-state --script operator.script --answers answers.txt");
    ASSERT_EQ(local.status, 0) << local.err;

    const auto localEnded = std::chrono::steady_clock::now();
    ServedSimulator served(m_dir / "lan-state", defaultScenario);
    const auto lanStarted = std::chrono::steady_clock::now();
    const clitest::CommandRun lan = clitest::runRcvrchar(
        m_dir, "--workdir lan --analyzer " + served.resource() +
                   " --clock virtual --script operator.script --answers answers.txt");
    const auto lanEnded = std::chrono::steady_clock::now();
    ASSERT_EQ(lan.status, 0) << lan.err << lan.out;
    using Seconds = std::chrono::duration<double>;
    std::printf("demo wall time: in-process %.3f s, over the loopback socket %.3f s\n",
                Seconds(localEnded - started).count(), Seconds(lanEnded - lanStarted).count());

    auto lines = [](const std::string& text, const std::string& start) {
        int count = 0;
        for (std::size_t at = text.find(start); at != std::string::npos;
             at = text.find("\n" + start, at + 1)) {
            ++count;
        }
        return count;
    };
    EXPECT_EQ(lines(lan.out, "Cal Complete"), 8) << lan.out;
    EXPECT_EQ(lines(lan.out, "Cal Complete"), lines(local.out, "Cal Complete"));
    EXPECT_NE(lan.out.find("[Restart the analyzer application] Restart the analyzer's "
                           "measurement application so that it loads the new "
                           "characterizations. => OK"),
              std::string::npos)
        << lan.out;
    EXPECT_EQ(lan.out.find("[Restart] Restarting TVA Application"), std::string::npos);
    EXPECT_NE(local.out.find("[Restart] Restarting TVA Application"), std::string::npos);

    expectSameFiles(filesUnder(m_dir / "lan-state" / "flash"),
                    filesUnder(m_dir / "local-state" / "flash"));
    expectSameFiles(filesUnder(m_dir / "lan"), filesUnder(m_dir / "local"));
}

TEST_F(OverTheRawSocket, AnAnalyzerThatIsNotThereIsOneClearError) {
    std::uint16_t port = 0;
    {
        // A port nobody listens on: taken, then given back.
        asio::io_context io;
        asio::ip::tcp::acceptor acceptor(io, {asio::ip::make_address("127.0.0.1"), 0});
        port = acceptor.local_endpoint().port();
    }
    const std::string resource = "TCPIP::127.0.0.1::" + std::to_string(port) + "::SOCKET";
    const clitest::CommandRun run = clitest::runRcvrchar(
        m_dir, "--workdir lan --analyzer " + resource + " --script operator.script --yes");
    EXPECT_EQ(run.status, 1);
    EXPECT_NE(run.err.find("connecting to " + resource + ": connection refused"), std::string::npos)
        << run.err;

    const clitest::CommandRun bad = clitest::runRcvrchar(
        m_dir, "--workdir lan --analyzer TCPIP::127.0.0.1::SOCKETS --script operator.script --yes");
    EXPECT_EQ(bad.status, 1);
    EXPECT_NE(bad.err.find("TCPIP[n]::HOST[::PORT]::SOCKET"), std::string::npos) << bad.err;
}
