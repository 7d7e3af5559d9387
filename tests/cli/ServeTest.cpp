#include <gtest/gtest.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <regex>
#include <thread>

#include "RunRcvrchar.h"
#include "TempDir.h"

using testsupport::TempDir;

namespace {

const std::string executable = RCVRCHAR_BINARY_DIR "/bin/rcvrchar";
const std::string clients = RCVRCHAR_SOURCE_DIR "/tests/cli/clients";

// `rcvrchar serve` running in the background until the object goes away (SIGTERM).
class ServeProcess {
  public:
    ServeProcess(const TempDir& dir, std::vector<std::string> arguments) {
        int out[2];
        if (::pipe(out) != 0) {
            throw std::runtime_error("pipe failed");
        }
        m_pid = ::fork();
        if (m_pid == 0) {
            ::dup2(out[1], STDOUT_FILENO);
            ::dup2(out[1], STDERR_FILENO);
            ::close(out[0]);
            if (::chdir(dir.path().c_str()) != 0) {
                ::_exit(126);
            }
            std::vector<char*> argv{const_cast<char*>(executable.c_str()),
                                    const_cast<char*>("serve")};
            for (auto& argument : arguments) {
                argv.push_back(argument.data());
            }
            argv.push_back(nullptr);
            ::execv(executable.c_str(), argv.data());
            ::_exit(127);
        }
        ::close(out[1]);
        m_out = out[0];
    }

    ~ServeProcess() {
        if (m_pid > 0 && !m_exited) {
            ::kill(m_pid, SIGKILL);
            ::waitpid(m_pid, nullptr, 0);
        }
        ::close(m_out);
    }

    // The next line the server prints, or "" when none comes within the timeout.
    std::string line(std::chrono::milliseconds timeout = std::chrono::seconds(10)) {
        const auto deadline = std::chrono::steady_clock::now() + timeout;
        for (;;) {
            if (const auto end = m_text.find('\n'); end != std::string::npos) {
                std::string text = m_text.substr(0, end);
                m_text.erase(0, end + 1);
                return text;
            }
            const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(
                deadline - std::chrono::steady_clock::now());
            pollfd entry{m_out, POLLIN, 0};
            if (left.count() <= 0 || ::poll(&entry, 1, static_cast<int>(left.count())) <= 0) {
                return "";
            }
            char buffer[4096];
            const auto n = ::read(m_out, buffer, sizeof buffer);
            if (n <= 0) {
                return "";
            }
            m_text.append(buffer, static_cast<std::size_t>(n));
        }
    }

    // Sends the signal and returns the exit status (-1 when it does not end in time).
    int stop(int signal) {
        ::kill(m_pid, signal);
        for (int i = 0; i < 100; ++i) {
            int status = 0;
            if (::waitpid(m_pid, &status, WNOHANG) == m_pid) {
                m_exited = true;
                return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
        }
        return -1;
    }

  private:
    pid_t m_pid = -1;
    int m_out = -1;
    bool m_exited = false;
    std::string m_text;
};

std::string shell(const std::string& command) {
    std::string output;
    FILE* pipe = ::popen((command + " 2>&1").c_str(), "r");
    char buffer[4096];
    while (const auto n = std::fread(buffer, 1, sizeof buffer, pipe)) {
        output.append(buffer, n);
    }
    const int status = ::pclose(pipe);
    return output + "[exit " + std::to_string(WIFEXITED(status) ? WEXITSTATUS(status) : -1) + "]";
}

}  // namespace

// Debian's pyvisa-py and lxi drive the served simulator over the raw socket on loopback.
TEST(ThreadedServe, PyvisaAndLxiDriveTheRawSocket) {
    TempDir dir;
    ServeProcess server(dir, {"--port", "0", "--sim-state", (dir / "state").string()});
    const std::string resource = server.line();
    std::smatch match;
    ASSERT_TRUE(
        std::regex_match(resource, match, std::regex(R"(TCPIP::127\.0\.0\.1::(\d+)::SOCKET)")))
        << resource;
    const std::string port = match[1];

    EXPECT_EQ(
        shell("timeout 120 /usr/bin/python3 " + clients + "/pyvisa_serve.py '" + resource + "'"),
        "pyvisa serve client passed\n[exit 0]");
    const std::string idn = shell("timeout 30 lxi scpi -r -a 127.0.0.1 -p " + port + " '*IDN?'");
    EXPECT_NE(idn.find("[exit 0]"), std::string::npos) << idn;
    EXPECT_GT(idn.size(), std::string("\n[exit 0]").size()) << idn;

    EXPECT_EQ(server.stop(SIGTERM), 0);
    // The file sent over the socket is on the simulator's drive, whole, after shutdown.
    EXPECT_EQ(testsupport::readFile(dir / "state" / "C" / "pyvisa.bin").size(), 256u * 40 + 5);
}

// VXI-11 clients look for the portmapper on port 111, and discovery broadcasts, so server and
// clients run in a network namespace that this test makes, with only loopback in it.
TEST(ThreadedServe, PyvisaAndLxiDriveVxi11ThroughThePortmapper) {
    TempDir dir;
    testsupport::writeFile(
        dir / "namespace.sh",
        "ip link set lo up || exit 90\n"
        "'" +
            executable +
            "' serve --port 0 --vxi11 --sim-state state > serve.txt 2>&1 &\n"
            "server=$!\n"
            "for i in $(seq 300); do grep -qs INSTR serve.txt && break; sleep 0.1; done\n"
            "timeout 120 /usr/bin/python3 '" +
            clients +
            "/pyvisa_serve.py' "
            "TCPIP::127.0.0.1::inst0::INSTR\n"
            "status=$?\n"
            "timeout 30 lxi scpi -a 127.0.0.1 '*IDN?' > lxi.txt 2>&1 || status=91\n"
            "timeout 30 lxi discover -t 2 > discover.txt 2>&1 || status=93\n"
            "kill -TERM $server; wait $server || status=92\n"
            "exit $status\n");
    const std::string output =
        shell("cd '" + dir.path().string() + "' && unshare -n sh namespace.sh");
    EXPECT_EQ(output, "pyvisa serve client passed\n[exit 0]");
    EXPECT_NE(testsupport::readFile(dir / "serve.txt").find("TCPIP::127.0.0.1::inst0::INSTR"),
              std::string::npos)
        << testsupport::readFile(dir / "serve.txt");
    const std::string idn = testsupport::readFile(dir / "lxi.txt");
    EXPECT_GT(idn.size(), 1u) << idn;
    EXPECT_EQ(idn.find("rror"), std::string::npos) << idn;
    // Broadcast discovery asks the portmapper over UDP, then the instrument for *IDN?.
    const std::string discovered = testsupport::readFile(dir / "discover.txt");
    EXPECT_NE(
        discovered.find("Found \"" + idn.substr(0, idn.find('\n')) + "\" on address 127.0.0.1"),
        std::string::npos)
        << discovered;
}

TEST(Serve, TakenPortOrBadAddressIsAClearError) {
    TempDir dir;
    ServeProcess first(dir, {"--port", "0", "--sim-state", (dir / "state").string()});
    const std::string resource = first.line();
    std::smatch match;
    ASSERT_TRUE(
        std::regex_match(resource, match, std::regex(R"(TCPIP::127\.0\.0\.1::(\d+)::SOCKET)")))
        << resource;
    const std::string port = match[1];
    const auto taken = clitest::runRcvrchar(dir, "serve --port " + port + " --sim-state other");
    EXPECT_EQ(taken.status, 1);
    EXPECT_EQ(taken.err, "cannot listen on TCP 127.0.0.1:" + port + ": Address already in use\n");
    const auto bad = clitest::runRcvrchar(dir, "serve --listen not.an.address");
    EXPECT_EQ(bad.status, 1);
    EXPECT_EQ(bad.err, "--listen \"not.an.address\" is not an IP address\n");
    EXPECT_EQ(first.stop(SIGINT), 0);
}

// Each link fault of the scenario, met by pyvisa-py as the timeout or error a script sees,
// while a second client is served as usual.
TEST(ThreadedServe, PyvisaMeetsEachLinkFaultAndTheServerGoesOn) {
    const std::vector<std::pair<std::string, std::string>> faults{
        {"drop_after_commands", "2"},
        {"drop_mid_response_on", R"({"command": "calc:data?"})"},
        {"stall_on", R"({"command": "*IDN?"})"},
        {"garbage_on", R"([{"command": "*idn?", "times": 1}])"},
        {"split_reply_ms", "300"},
        {"restart_after_commands", "3"},
    };
    for (const auto& [fault, value] : faults) {
        SCOPED_TRACE(fault);
        TempDir dir;
        testsupport::writeFile(dir / "scenario.json",
                               R"({"faults": {"link": {")" + fault + "\": " + value + "}}}");
        ServeProcess server(dir, {"--port", "0", "--scenario", (dir / "scenario.json").string(),
                                  "--sim-state", (dir / "state").string()});
        const std::string resource = server.line();
        ASSERT_TRUE(std::regex_match(resource, std::regex(R"(TCPIP::127\.0\.0\.1::\d+::SOCKET)")))
            << resource;
        EXPECT_EQ(shell("timeout 60 /usr/bin/python3 " + clients + "/pyvisa_link_fault.py " +
                        fault + " '" + resource + "'"),
                  fault + " seen as expected\n[exit 0]");
        EXPECT_EQ(server.stop(SIGTERM), 0);
    }
}
