#pragma once

// The simulated analyzer served on a loopback raw socket inside the test, as `rcvrchar
// serve` serves it.

#include <filesystem>
#include <memory>
#include <string>

#include "lan/RawSocketServer.h"
#include "lan/ServerContext.h"
#include "sim/Scenario.h"
#include "sim/SimulatedAnalyzer.h"

namespace remotetest {

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

}  // namespace remotetest
