#include "program/command/commands.h"
#include "program/command/lastresort.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/view/qrtext.h"
#include "program/view/timetext.h"
#include "program/watch/watchcommand.h"

#include <velmora/error.h>
#include <velmora/longwatch.h>

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

namespace {

// A link that stands alone on standard output can be taken from there by another program.
void tellPage(PageLink const& page, bool forPage)
{
    if (forPage && page.outputIsFree) {
        fmt::print("{}\n", page.link);
        flushOutput();
    } else {
        tell("The page: " + page.link + "\n");
    }
    if (!page.remark.empty()) {
        tell(page.remark + "\n");
    }
#ifdef VELMORA_DASH
    if (forPage) {
        tell(qrForTerminal(page.link, STDERR_FILENO));
    }
#endif
}

LongWatchOptions optionsOf(GlobalOptions const& global, WatchOptions const& chosen)
{
    LongWatchOptions options;
    options.car = global;
    options.configFile = chosen.config;
    options.sensors = chosen.sensors;
    options.outputs = chosen.outputs;
    options.vehicle = chosen.vehicle;
    options.fullVin = chosen.vin.empty() ? std::nullopt : std::optional(chosen.vin == "full");
    options.stopAfter = chosen.stopAfter;
    options.wake = chosen.wake;
    options.electric = chosen.electric;
    options.fast = chosen.fast;
    options.forPage = chosen.page;
    if (!global.quiet) {
        options.onEvent = [](std::string const& text) {
            tell(isoTime(std::chrono::system_clock::now()) + " " + text + "\n");
        };
    }
    options.onPage = [forPage = chosen.page](PageLink const& page) { tellPage(page, forPage); };
    options.onReload = [](std::string const& text) { tell(text + "\n"); };
    return options;
}

constexpr std::chrono::milliseconds carPatience{700}; // with the car, before the outputs are ended without it

// What signals do to a watch.
class WatchSignals
{
public:
    // reloads: a hang-up has the settings read again.
    WatchSignals(LongWatch& watch, bool reloads)
    {
        Interrupt::instance().setHandler([this, &watch] {
            watch.end();
            m_lastResort.arm(carPatience, [&watch] { giveUp(watch); });
        });
        if (reloads) {
            Interrupt::instance().setHangUpHandler([&watch] { watch.reload(); });
        }
    }
    ~WatchSignals()
    {
        Interrupt::instance().setHandler(nullptr);
        Interrupt::instance().setHangUpHandler(nullptr);
    }
    WatchSignals(WatchSignals const&) = delete;
    WatchSignals& operator=(WatchSignals const&) = delete;

private:
    // What hangs in the operating system, such as the way to an adapter that is out of reach, hears no signal.
    static void giveUp(LongWatch& watch)
    {
        if (watch.abandon()) {
            ::_exit(static_cast<int>(ExitCode::Done));
        }
    }

    LastResort m_lastResort;
};

} // namespace

ExitCode runWatch(GlobalOptions const& global, WatchOptions const& chosen)
{
    LongWatch watch(optionsOf(global, chosen));
    if (chosen.checkConfig) {
        tell("The settings make sense\n");
        return ExitCode::Done;
    }
    // A page ends with its terminal, where there is no file to read again.
    WatchSignals const signals(watch, !chosen.page || !chosen.config.empty());
    watch.run();
    return ExitCode::Done;
}

void addWatchCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<WatchOptions>();
    CLI::App* const command =
        commandLine.addCommand("watch", "Read for months, write to any number of outputs, spare the battery",
                               [chosen](GlobalOptions const& global) { return runWatch(global, *chosen); });
    addWatchOptions(*command, *chosen);
}

void addWatchOptions(CLI::App& command, WatchOptions& chosen)
{
    command.add_option("SENSOR", chosen.sensors,
                       "Sensors with rates: RPM@10hz, 7E8:SPEED; without: those of trips, load, throttle, fuel level");
    command
        .add_option("-o,--output", chosen.outputs,
                    "csv:FILE, csv-long:FILE, ndjson:FILE, sqlite:FILE, influx:FILE,\n"
                    "influx:udp://HOST:PORT, prometheus:HOST:PORT, dash:HOST:PORT, mqtt://HOST:PORT/TOPIC;\n"
                    "settings behind a question mark: csv:a.csv?rotate=day. May be repeated")
        ->type_name("KIND:TARGET")
        ->allow_extra_args(false);
    command.add_option("--config", chosen.config, "Settings of the watch (TOML)")->type_name("FILE");
    command.add_flag("--check-config", chosen.checkConfig, "Only report mistakes in the settings");
    command.add_option("--vehicle", chosen.vehicle, "Name of the vehicle in all outputs")->type_name("NAME");
    command.add_option("--vin", chosen.vin, "Whether the outputs may hold the VIN: none or full")
        ->type_name("none|full")
        ->check(CLI::IsMember({"none", "full"}));
    command.add_option("--stop-after", chosen.stopAfter, "Ask on that long after the engine has stopped (120s)")
        ->type_name("TIME");
    command.add_option("--wake", chosen.wake, "voltage, or \"every 30min\" for one request to the parked car")
        ->type_name("WAY");
    command.add_flag("--electric", chosen.electric, "The car is hybrid or electric");
    command.add_flag("--fast", chosen.fast, "Ask as fast as the bus allows");
}

} // namespace velmora::cli
