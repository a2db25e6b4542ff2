#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/signal/signalfile.h"
#include "program/command/commands.h"
#include "program/command/lastresort.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/watch/watchcommand.h"
#include "program/watch/watchrun.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

namespace {

[[noreturn]] void rejectOption(std::string const& option, std::string const& text, std::string const& expected)
{
    throw Error(ErrorKind::WrongUse, option + ": \"" + text + "\" is not " + expected);
}

// A watch that runs for months had better not begin, nor go on, with files that it can't read.
void checkSignalFiles(std::vector<std::string> const& files)
{
    std::vector<std::string> mistakes;
    for (std::string const& file : files) {
        for (SignalMistake const& each : checkSignalFile(file).mistakes) {
            mistakes.push_back(toText(each, file));
        }
    }
    if (!mistakes.empty()) {
        throw Error(ErrorKind::WrongUse, fmt::format("{}", fmt::join(mistakes, "\n")));
    }
}

// What the command line says stands above what the file says; outputs come on top.
WatchSettings settingsOf(GlobalOptions const& global, WatchOptions const& chosen)
{
    WatchSettings settings = chosen.config.empty() ? WatchSettings() : readWatchSettings(chosen.config);
    checkSignalFiles(settings.signals);
    checkSignalFiles(global.signalFiles);
    if (!chosen.sensors.empty()) {
        settings.sensors = chosen.sensors;
        for (std::string const& each : chosen.sensors) {
            parseSensorWish(each);
        }
    }
    for (std::string const& each : chosen.outputs) {
        settings.outputs.push_back(parseOutputAddress(each));
    }
    if (!chosen.vehicle.empty()) {
        if (!isVehicleName(chosen.vehicle)) {
            rejectOption("--vehicle", chosen.vehicle, "a name of letters, digits, - and _");
        }
        settings.vehicle = chosen.vehicle;
    }
    if (!chosen.vin.empty()) {
        settings.fullVin = chosen.vin == "full";
    }
    if (!chosen.stopAfter.empty()) {
        auto const time = parseDuration(chosen.stopAfter);
        if (!time || *time < std::chrono::seconds(1)) {
            rejectOption("--stop-after", chosen.stopAfter, "a time such as 120s or 5min");
        }
        settings.battery.stopAfter = std::chrono::floor<std::chrono::seconds>(*time);
    }
    if (!chosen.wake.empty() && !parseWake(chosen.wake, settings.battery)) {
        rejectOption("--wake", chosen.wake, "\"voltage\" or such as \"every 30min\"");
    }
    settings.battery.electric = settings.battery.electric || chosen.electric;
    settings.fast = settings.fast || chosen.fast;
    return settings;
}

constexpr std::chrono::milliseconds carPatience{700}; // with the car, before the outputs are ended without it

// A run, and what signals do to it.
class WatchCommand
{
public:
    WatchCommand(GlobalOptions const& global, WatchOptions const& chosen)
        : m_global(global), m_chosen(chosen), m_settings(settingsOf(global, chosen))
    {
        Interrupt::instance().setHandler([this] {
            end();
            m_lastResort.arm(carPatience, [this] { giveUp(); });
        });
        // The page ends with its terminal; there is no file to read again.
        if (!m_chosen.page || !m_chosen.config.empty()) {
            Interrupt::instance().setHangUpHandler([this] {
                m_reload = true;
                end();
            });
        }
    }
    ~WatchCommand()
    {
        Interrupt::instance().setHandler(nullptr);
        Interrupt::instance().setHangUpHandler(nullptr);
    }
    WatchCommand(WatchCommand const&) = delete;
    WatchCommand& operator=(WatchCommand const&) = delete;

    ExitCode run()
    {
        while (!Interrupt::instance().raised()) {
            runOnce();
            if (m_reload.exchange(false)) {
                reload();
            }
        }
        m_notify.tell("STOPPING=1");
        return ExitCode::Done;
    }

private:
    void runOnce()
    {
        auto run = std::make_unique<WatchRun>(m_global, m_settings, m_notify, m_chosen.page);
        WatchRun& now = *run;
        {
            std::lock_guard const lock(m_mutex);
            m_run = std::move(run);
        }
        try {
            if (!Interrupt::instance().raised() && !m_reload) {
                now.run();
            }
            now.finish();
        } catch (...) {
            now.finish();
            forget();
            throw;
        }
        forget();
    }

    void forget()
    {
        std::lock_guard const lock(m_mutex);
        m_run.reset();
    }

    void end()
    {
        std::lock_guard const lock(m_mutex);
        if (m_run != nullptr) {
            m_run->end();
        }
    }

    // What hangs in the operating system, such as the way to an adapter that is out of reach, hears no signal.
    void giveUp()
    {
        std::lock_guard const lock(m_mutex);
        if (m_run == nullptr || m_run->endOutputs()) {
            m_notify.tell("STOPPING=1");
            ::_exit(static_cast<int>(ExitCode::Done));
        }
    }

    // Settings that make no sense leave the old ones in force.
    void reload()
    {
        m_notify.tell("RELOADING=1");
        try {
            m_settings = settingsOf(m_global, m_chosen);
            tell("The settings were read again\n");
        } catch (Error const& error) {
            tell(std::string("The settings stay as they were: ") + error.what() + "\n");
        }
    }

    GlobalOptions const m_global;
    WatchOptions const m_chosen;
    WatchSettings m_settings;
    ServiceNotify m_notify;
    std::atomic<bool> m_reload{false};
    std::mutex m_mutex;
    std::unique_ptr<WatchRun> m_run; // protected by m_mutex
    LastResort m_lastResort;
};

} // namespace

ExitCode runWatch(GlobalOptions const& global, WatchOptions const& chosen)
{
    if (chosen.checkConfig) {
        settingsOf(global, chosen);
        tell("The settings make sense\n");
        return ExitCode::Done;
    }
    return WatchCommand(global, chosen).run();
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
