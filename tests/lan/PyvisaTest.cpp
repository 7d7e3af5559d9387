#include <gtest/gtest.h>
#include <sched.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <thread>

#include "FakeDevice.h"
#include "lan/Portmapper.h"
#include "lan/RawSocketServer.h"
#include "lan/Vxi11.h"
#include "lan/Vxi11Server.h"

using namespace lantest;

namespace {

const std::string client = std::string(RCVRCHAR_SOURCE_DIR) + "/tests/lan/clients/pyvisa_client.py";

struct Outcome {
    int status;
    std::string output;
};

// Runs Debian's pyvisa (never a pip one) against `resource`.
Outcome runPyvisa(const std::string& resource) {
    const std::string command =
        "timeout 120 /usr/bin/python3 " + client + " '" + resource + "' 2>&1";
    Outcome outcome{-1, ""};
    FILE* pipe = ::popen(command.c_str(), "r");
    if (!pipe) {
        return outcome;
    }
    char buffer[4096];
    while (const auto n = std::fread(buffer, 1, sizeof buffer, pipe)) {
        outcome.output.append(buffer, n);
    }
    outcome.status = ::pclose(pipe);
    return outcome;
}

}  // namespace

TEST(ThreadedPyvisa, RawSocketServesPyvisa) {
    FakeDevice device;
    lan::ServerContext context;
    lan::RawSocketServer server(context, device, {asio::ip::make_address("127.0.0.1"), 0});
    const Outcome outcome =
        runPyvisa("TCPIP::127.0.0.1::" + std::to_string(server.port()) + "::SOCKET");
    EXPECT_EQ(outcome.status, 0) << outcome.output;
    EXPECT_NE(outcome.output.find("pyvisa client passed"), std::string::npos) << outcome.output;
}

// pyvisa finds VXI-11 instruments through the portmapper on port 111, so the server and the
// client run in a child process inside a network namespace of its own, with only loopback.
TEST(ThreadedPyvisa, Vxi11ServesPyvisaThroughThePortmapper) {
    int pipeEnds[2];
    ASSERT_EQ(::pipe(pipeEnds), 0);
    const pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        ::close(pipeEnds[0]);
        int status = 0;
        std::string output;
        if (::unshare(CLONE_NEWNET) != 0 || std::system("ip link set lo up") != 0) {
            output = "cannot make a network namespace (needs root)";
            status = 2;
        } else {
            FakeDevice device;
            lan::ServerContext context;
            const auto loopback = asio::ip::make_address("127.0.0.1");
            lan::Vxi11Server server(context, device, loopback);
            lan::Portmapper portmapper(context, loopback, 111,
                                       {{lan::vxi11::coreProgram, lan::vxi11::version,
                                         lan::rpc::protocolTcp, server.corePort()}});
            const Outcome outcome = runPyvisa("TCPIP::127.0.0.1::inst0::INSTR");
            status = outcome.status;
            output = outcome.output;
        }
        [[maybe_unused]] auto written = ::write(pipeEnds[1], output.data(), output.size());
        ::_exit(status == 0 ? 0 : 1);
    }
    ::close(pipeEnds[1]);
    std::string output;
    char buffer[4096];
    while (true) {
        const auto n = ::read(pipeEnds[0], buffer, sizeof buffer);
        if (n <= 0) {
            break;
        }
        output.append(buffer, static_cast<std::size_t>(n));
    }
    ::close(pipeEnds[0]);
    int status = 0;
    ::waitpid(child, &status, 0);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << output;
    EXPECT_NE(output.find("pyvisa client passed"), std::string::npos) << output;
}
