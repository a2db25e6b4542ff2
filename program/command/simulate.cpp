#include "libvelmora/port/portaddress.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "simulator/error.h"
#include "simulator/server.h"
#include "simulator/simulation.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdio>
#include <memory>
#include <variant>

namespace velmora::cli {

namespace {

struct SimulateOptions
{
    std::string listen = "tcp://127.0.0.1:35000";
    std::string vehicle;
    std::string replay;
    std::string adapter;
    std::vector<std::string> faults;
    bool list = false;
};

std::shared_ptr<obdsim::IPeer> makePeer(SimulateOptions const& options)
{
    if (!options.replay.empty()) {
        return obdsim::replay(options.replay, options.faults);
    }
    obdsim::SimulationOptions simulation;
    simulation.faults = options.faults;
    if (!options.vehicle.empty()) {
        simulation.vehicle = options.vehicle;
    }
    if (!options.adapter.empty()) {
        simulation.adapter = options.adapter;
    }
    return obdsim::simulate(simulation);
}

std::unique_ptr<obdsim::IServer> makeServer(SimulateOptions const& options)
{
    std::shared_ptr<obdsim::IPeer> const peer = makePeer(options);
    if (options.listen == "pty") {
        return obdsim::servePseudoTerminal(peer);
    }
    // Port 0 is no address to connect to, but one to listen on: any free port.
    bool const anyPort = options.listen.ends_with(":0");
    std::string const text = anyPort ? options.listen.substr(0, options.listen.size() - 2) : options.listen;
    PortAddress const parsed = parsePortAddress(text);
    TcpAddress const* const address = std::get_if<TcpAddress>(&parsed);
    if (address == nullptr) {
        throw Error(ErrorKind::WrongUse, "--listen takes tcp://HOST:PORT or pty");
    }
    return obdsim::serveTcp(peer, address->host, anyPort ? std::uint16_t{0} : address->port);
}

void printNames()
{
    fmt::print("Vehicles:\n");
    for (std::string const& name : obdsim::simulatedVehicles()) {
        fmt::print("  {}\n", name);
    }
    fmt::print("Adapters:\n");
    for (std::string const& name : obdsim::simulatedAdapters()) {
        fmt::print("  {}\n", name);
    }
}

ExitCode simulate(SimulateOptions const& options)
{
    if (options.list) {
        printNames();
        return ExitCode::Done;
    }
    try {
        std::unique_ptr<obdsim::IServer> const server = makeServer(options);
        fmt::print("{}\n", server->address());
        std::fflush(stdout);
        Interrupt::instance().setHandler([&server] { server->stop(); });
        server->run();
        Interrupt::instance().setHandler(nullptr);
    } catch (obdsim::ServerError const& error) {
        throw Error(ErrorKind::PortFailed, error.what(), {"choose another address with --listen"});
    } catch (obdsim::SimulatorError const& error) {
        throw Error(ErrorKind::WrongUse, error.what(), {"velmora simulate --list tells vehicles and adapters"});
    }
    return ExitCode::Done;
}

} // namespace

void addSimulateCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<SimulateOptions>();
    CLI::App* const command = commandLine.addCommand("simulate", "Serve a simulated adapter to any program",
                                                     [options](GlobalOptions const&) { return simulate(*options); });
    command->add_option("--listen", options->listen, "tcp://HOST:PORT (port 0: any free one) or pty")
        ->capture_default_str();
    command->add_option("--vehicle", options->vehicle, "A built-in vehicle, or a vehicle file");
    command->add_option("--replay", options->replay, "Serve a recorded dialogue instead of a vehicle");
    command->add_option("--adapter", options->adapter, "A built-in adapter");
    command->add_option("--fault", options->faults, "Something that goes wrong, such as cut@120; may be repeated");
    command->add_flag("--list", options->list, "List vehicles and adapters");
}

} // namespace velmora::cli
