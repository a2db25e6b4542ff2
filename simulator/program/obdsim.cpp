#include "simulator/adapter/quirk.h"
#include "simulator/serve/session.h"
#include "simulator/server.h"
#include "simulator/simulation.h"
#include "tools/manual/completion.h"
#include "tools/manual/manualpage.h"

#include <CLI/CLI.hpp>
#include <asio/io_context.hpp>
#include <asio/signal_set.hpp>

#include <cstdio>
#include <string_view>
#include <thread>

namespace {

constexpr int wrongUse = 2;
constexpr int failed = 1;

void printNames(char const* title, std::vector<std::string> const& names)
{
    std::printf("%s:\n", title);
    for (auto const& name : names) {
        std::printf("  %s\n", name.c_str());
    }
}

void printAll()
{
    printNames("Vehicles", obdsim::simulatedVehicles());
    printNames("Adapters", obdsim::simulatedAdapters());
    printNames("Drives", obdsim::simulatedDrives());
    printNames("Faults", obdsim::faultForms());
    printNames("Control lines", obdsim::controlForms());
}

// False if the trace could not be written.
bool serve(obdsim::SessionOptions const& options)
{
    obdsim::Session session(options);
    for (auto const& address : session.addresses()) {
        std::printf("%s\n", address.c_str());
    }
    if (options.control) {
        std::printf("control %s\n", session.controlAddress().c_str());
    }
    std::fflush(stdout);
    asio::io_context context;
    asio::signal_set signals(context, SIGINT, SIGTERM);
    signals.async_wait([&session](asio::error_code const& error, int /*signal*/) {
        if (!error) {
            session.stop();
        }
    });
    std::thread waiting([&context] { context.run(); });
    try {
        session.run();
    } catch (...) {
        context.stop();
        waiting.join();
        throw;
    }
    context.stop();
    waiting.join();
    return !session.traceFailed();
}

// What the program tells packages and shells of its own command line: see describeItself of the other one.
bool describeItself(CLI::App const& app, int argc, char const* const* argv)
{
    using namespace velmora::manual;
    auto const names = [](std::vector<std::string> const& words) {
        Completion completion;
        for (std::string const& word : words) {
            completion.candidates.push_back({word, {}});
        }
        return completion;
    };
    std::string_view const wish = argc > 1 ? argv[1] : "";
    if (wish == "__manual" && argc == 3) {
        writeManual(argv[2], describe(app), {OBDSIM_VERSION, manualDate(), ".BR velmora (1)"});
        return true;
    }
    if (wish == "__complete") {
        auto const files = [](std::string const& /*begun*/) { return Completion{{}, true}; };
        Sources const sources = {
            {"--vehicle", [&names](std::string const& /*begun*/) { return names(obdsim::simulatedVehicles()); }},
            {"--adapter", [&names](std::string const& /*begun*/) { return names(obdsim::simulatedAdapters()); }},
            {"--listen",
             [&names](std::string const& /*begun*/) {
                 return names({"pty", "tcp://127.0.0.1:0"});
             }},
            {"--replay", files},
            {"--drive", [&names](std::string const& /*begun*/) { return names(obdsim::simulatedDrives()); }},
            {"--scenario", files},
            {"--write-scenario", files},
            {"--trace", files}};
        std::fputs(printed(complete(describe(app), sources, {argv + 2, argv + argc})).c_str(), stdout);
        return true;
    }
    return false;
}

} // namespace

int main(int argc, char** argv)
{
    CLI::App app("Plays an ELM327 adapter with a car behind it", "obdsim");
    obdsim::SessionOptions options;
    bool list = false;
    app.add_option("--listen", options.listen, "tcp://HOST:PORT (port 0: any free one) or pty")->capture_default_str();
    app.add_option("--vehicle", options.simulation.vehicle, "A built-in vehicle, or a vehicle file")
        ->capture_default_str();
    app.add_option("--replay", options.replay, "Serve a recorded dialogue instead of a vehicle");
    app.add_option("--adapter", options.simulation.adapter, "A built-in adapter")->capture_default_str();
    app.add_option("--fault", options.simulation.faults, "Something that goes wrong, such as cut@120; may be repeated");
    app.add_option("--scenario", options.simulation.scenario, "Control lines with their times");
    app.add_option("--drive", options.simulation.drive, "A built-in drive, or a CSV file (seconds,speed,...)");
    app.add_option("--write-scenario", options.written, "Write what control lines have changed as a scenario");
    app.add_option("--control", options.control, "Take control lines on this port of 127.0.0.1 (0: any free one)")
        ->check(CLI::Range(0, 65535));
    app.add_option("--fleet", options.fleet, "Serve so many cars, each at an address of its own")
        ->capture_default_str();
    app.add_option("--trace", options.trace, "Write all that passes to this file");
    app.add_flag("--list", list, "List vehicles, adapters, faults and control lines");
    try {
        if (describeItself(app, argc, argv)) {
            return 0;
        }
        app.parse(argc, argv);
        if (list) {
            printAll();
        } else if (!serve(options)) {
            return failed;
        }
        return 0;
    } catch (CLI::ParseError const& error) {
        return app.exit(error) == 0 ? 0 : wrongUse;
    } catch (obdsim::ServerError const& error) {
        std::fprintf(stderr, "obdsim: %s\n", error.what());
        return failed;
    } catch (obdsim::SimulatorError const& error) {
        std::fprintf(stderr, "obdsim: %s\n", error.what());
        return wrongUse;
    }
}
