#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "simulator/error.h"
#include "simulator/serve/session.h"
#include "simulator/server.h"
#include "simulator/simulation.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdio>
#include <memory>

namespace velmora::cli {

namespace {

struct SimulateOptions
{
    obdsim::SessionOptions session;
    bool list = false;
};

void printNames(char const* title, std::vector<std::string> const& names)
{
    fmt::print("{}:\n", title);
    for (std::string const& name : names) {
        fmt::print("  {}\n", name);
    }
}

// While it lives a signal ends the session. Who is about to end it is waited for, so that the session may go behind it.
class SimulationStop
{
public:
    explicit SimulationStop(obdsim::Session& session)
    {
        Interrupt::instance().setHandler([&session] { session.stop(); });
    }
    ~SimulationStop() { Interrupt::instance().setHandler(nullptr); }
    SimulationStop(SimulationStop const&) = delete;
    SimulationStop& operator=(SimulationStop const&) = delete;
};

// False if the trace could not be written.
bool serve(obdsim::SessionOptions const& options)
{
    obdsim::Session session(options);
    for (std::string const& address : session.addresses()) {
        fmt::print("{}\n", address);
    }
    if (options.control) {
        fmt::print("control {}\n", session.controlAddress());
    }
    std::fflush(stdout);
    SimulationStop const stop(session);
    session.run();
    return !session.traceFailed();
}

ExitCode simulate(SimulateOptions const& options, GlobalOptions const& global)
{
    if (options.list) {
        printNames("Vehicles", obdsim::simulatedVehicles());
        printNames("Adapters", obdsim::simulatedAdapters());
        printNames("Drives", obdsim::simulatedDrives());
        printNames("Faults", obdsim::faultForms());
        printNames("Control lines", obdsim::controlForms());
        return ExitCode::Done;
    }
    obdsim::SessionOptions session = options.session;
    session.trace = global.traceFile;
    try {
        return serve(session) ? ExitCode::Done : ExitCode::Failed;
    } catch (obdsim::ServerError const& error) {
        throw Error(ErrorKind::PortFailed, error.what(), {"choose another address with --listen"});
    } catch (obdsim::SimulatorError const& error) {
        throw Error(ErrorKind::WrongUse, error.what(), {"velmora simulate --list shows what there is to choose from"});
    }
}

} // namespace

void addSimulateCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<SimulateOptions>();
    CLI::App* const command =
        commandLine.addCommand("simulate", "Serve a simulated adapter to any program",
                               [options](GlobalOptions const& global) { return simulate(*options, global); });
    obdsim::SessionOptions& session = options->session;
    command->add_option("--listen", session.listen, "tcp://HOST:PORT (port 0: any free one) or pty")
        ->type_name("ADDRESS")
        ->capture_default_str();
    command->add_option("--vehicle", session.simulation.vehicle, "A built-in vehicle, or a vehicle file")
        ->type_name("VEHICLE");
    command->add_option("--replay", session.replay, "Serve a recorded dialogue instead of a vehicle")
        ->type_name("FILE");
    command->add_option("--adapter", session.simulation.adapter, "A built-in adapter")->type_name("ADAPTER");
    command
        ->add_option("--fault", session.simulation.faults,
                     "Something that goes wrong, such as cut@120; may be repeated")
        ->type_name("FAULT");
    command->add_option("--scenario", session.simulation.scenario, "Control lines with their times")->type_name("FILE");
    command->add_option("--drive", session.simulation.drive, "A built-in drive, or a CSV file (seconds,speed,...)")
        ->type_name("DRIVE");
    command->add_option("--write-scenario", session.written, "Write what control lines have changed as a scenario")
        ->type_name("FILE");
    command->add_option("--control", session.control, "Take control lines on this port of 127.0.0.1 (0: any free one)")
        ->type_name("N")
        ->check(CLI::Range(0, 65535));
    command->add_option("--fleet", session.fleet, "Serve so many cars, each at an address of its own")->type_name("N");
    command->add_flag("--list", options->list, "List vehicles, adapters, faults and control lines");
}

} // namespace velmora::cli
