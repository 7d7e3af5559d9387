// The executable against an analyzer that is not there, or named wrongly: one clear error.

#include <gtest/gtest.h>

#include <asio.hpp>

#include "RunRcvrchar.h"
#include "TempDir.h"

TEST(OverTheRawSocket, AnAnalyzerThatIsNotThereIsOneClearError) {
    testsupport::TempDir dir;
    std::filesystem::create_directories(dir / "lan");
    std::filesystem::copy_file(testsupport::sampleConfiguration(), dir / "lan" / "RcvrChar.dat");
    testsupport::writeFile(dir / "operator.script", "selectall\nrun\nwait\n");
    std::uint16_t port = 0;
    {
        // A port nobody listens on: taken, then given back.
        asio::io_context io;
        asio::ip::tcp::acceptor acceptor(io, {asio::ip::make_address("127.0.0.1"), 0});
        port = acceptor.local_endpoint().port();
    }
    const std::string resource = "TCPIP::127.0.0.1::" + std::to_string(port) + "::SOCKET";
    const clitest::CommandRun run = clitest::runRcvrchar(
        dir, "--workdir lan --analyzer " + resource + " --script operator.script --yes");
    EXPECT_EQ(run.status, 1);
    EXPECT_NE(run.err.find("connecting to " + resource + ": connection refused"), std::string::npos)
        << run.err;

    const clitest::CommandRun bad = clitest::runRcvrchar(
        dir, "--workdir lan --analyzer TCPIP::127.0.0.1::SOCKETS --script operator.script --yes");
    EXPECT_EQ(bad.status, 1);
    EXPECT_NE(bad.err.find("TCPIP[n]::HOST[::PORT]::SOCKET"), std::string::npos) << bad.err;
}
