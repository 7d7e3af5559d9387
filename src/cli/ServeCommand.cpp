// `rcvrchar serve`: one simulated analyzer as a LAN instrument (raw SCPI socket, and VXI-11
// with its own portmapper) until SIGINT or SIGTERM, then a clean shutdown that leaves the
// simulator's flash and files whole.

#include <csignal>
#include <iostream>
#include <optional>

#include "cli/AnalyzerOptions.h"
#include "cli/CommandRegistry.h"
#include "cli/ScenarioLinkFaults.h"
#include "cli/WorkFolderLock.h"
#include "lan/Portmapper.h"
#include "lan/RawSocketServer.h"
#include "lan/Vxi11.h"
#include "lan/Vxi11Server.h"
#include "sim/SimulatedAnalyzer.h"

namespace {

struct ServeOptions {
    std::string scenario;
    std::string listen = "127.0.0.1";
    std::uint16_t port = 5025;
    bool vxi11 = false;
    std::uint16_t portmapperPort = 111;
    cli::AnalyzerOptions analyzer;
};

asio::ip::address listenAddress(const std::string& text) {
    std::error_code error;
    const auto address = asio::ip::make_address(text, error);
    if (error) {
        throw std::string("--listen \"" + text + "\" is not an IP address");
    }
    return address;
}

// The address a client on this machine uses to reach a server listening on `address`.
std::string reachableHost(const asio::ip::address& address) {
    if (address.is_unspecified()) {
        return address.is_v6() ? "::1" : "127.0.0.1";
    }
    return address.to_string();
}

int serve(ServeOptions options) {
    if (!options.scenario.empty()) {
        options.analyzer.analyzer = "sim:" + options.scenario;
    }
    const auto address = listenAddress(options.listen);
    // The server writes nothing in the working folder, only in the simulator's state.
    const cli::WorkFolderLocks locks(options.analyzer, "serve",
                                     cli::WorkFolderLocks::Scope::StateOnly);
    cli::AnalyzerSession session(options.analyzer);
    if (!session.simulator()) {
        throw std::string("serve puts the simulated analyzer on the network; --analyzer " +
                          options.analyzer.analyzer + " is not the simulator");
    }
    sim::SimulatedAnalyzer& simulator = *session.simulator();
    const auto device = simulator.scpiDevice();
    // Called on the execution thread, which owns the instrument.
    cli::ScenarioLinkFaults faults(simulator.scenario().faults.link,
                                   [&simulator] { simulator.restartApplication(); });

    // Servers go before the context they run on, and the device and faults after both.
    lan::ServerContext context(2);
    lan::RawSocketServer::Options rawOptions;
    rawOptions.faults = &faults;
    lan::RawSocketServer raw(context, *device, {address, options.port}, rawOptions);
    std::optional<lan::Vxi11Server> vxi11;
    std::optional<lan::Portmapper> portmapper;
    if (options.vxi11) {
        vxi11.emplace(context, *device, address);
        portmapper.emplace(
            context, address, options.portmapperPort,
            std::vector<lan::Portmapper::Mapping>{{lan::vxi11::coreProgram, lan::vxi11::version,
                                                   lan::rpc::protocolTcp, vxi11->corePort()}});
    }
    // Handled from here on, so that a signal right after the announcement shuts down cleanly.
    asio::io_context signals;
    asio::signal_set stopSignals(signals, SIGINT, SIGTERM);
    stopSignals.async_wait([](std::error_code, int) {});

    const std::string host = reachableHost(address);
    std::cout << "TCPIP::" << host << "::" << raw.port() << "::SOCKET\n";
    if (vxi11) {
        std::cout << "TCPIP::" << host << "::inst0::INSTR (portmapper on port "
                  << portmapper->port() << ", core channel on port " << vxi11->corePort() << ")\n";
    }
    std::cout << std::flush;
    signals.run();
    context.stop();
    return 0;
}

const cli::CommandRegistration registration("serve", [](CLI::App& app) {
    app.description(
        "Serve the simulated analyzer on the network as a LAN instrument (raw SCPI socket, "
        "and VXI-11 with --vxi11) until SIGINT or SIGTERM");
    auto options = std::make_shared<ServeOptions>();
    app.add_option("--scenario", options->scenario, "Simulator scenario file (JSON)");
    app.add_option("--sim-state", options->analyzer.simState,
                   "State directory of the simulated analyzer (default: analyzer-sim in the "
                   "working directory)");
    app.add_option("--listen", options->listen,
                   "Address to listen on; 0.0.0.0 puts the instrument on the LAN")
        ->capture_default_str();
    app.add_option("--port", options->port, "Raw SCPI socket port; 0 takes a free port")
        ->capture_default_str();
    app.add_flag("--vxi11", options->vxi11, "Also serve VXI-11, with a portmapper");
    app.add_option("--portmapper-port", options->portmapperPort,
                   "Port of the VXI-11 portmapper; clients look for it on 111")
        ->capture_default_str();
    app.add_option("--clock", options->analyzer.clock,
                   "Sweep time: real (a sweep takes as long as on an analyzer, *OPC? waits) "
                   "or virtual (immediate)")
        ->check(CLI::IsMember({"virtual", "real"}))
        ->capture_default_str();
    app.add_option("--trace", options->analyzer.trace, "Write every SCPI exchange here");
    return [options] { return serve(*options); };
});

}  // namespace
