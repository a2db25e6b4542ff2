#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/lineprinter.h"
#include "program/view/trafficlog.h"

#include <chrono>
#include <mutex>
#include <optional>
#include <thread>

namespace velmora::cli {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds lookInterval{50};

struct LogOptions
{
    std::vector<std::string> sensors;
    std::size_t count = 0; // entries after the connection stands; 0: no end
    double duration = 0.0; // seconds after the connection stands; 0: no end
};

// Prints what it is told of, from any thread.
class TrafficPrinter
{
public:
    explicit TrafficPrinter(bool json) : m_json(json) {}

    void print(obd::MessageDataModel const& entry)
    {
        std::lock_guard const lock(m_mutex);
        if (m_left == std::size_t{0}) {
            return;
        }
        m_printer.print(m_json ? toJsonLine(entry) : toLine(entry));
        if (m_left) {
            --*m_left;
        }
    }

    // Prints this many entries more, and none after.
    void limit(std::size_t entries)
    {
        std::lock_guard const lock(m_mutex);
        m_left = entries;
    }
    bool done() const
    {
        std::lock_guard const lock(m_mutex);
        return m_left == std::size_t{0};
    }
    bool readerGone() const { return m_printer.readerGone(); }

    // Ends with what was told so far. Throws Error if it can't be printed.
    void finish()
    {
        limit(0);
        m_printer.finish();
    }

private:
    bool const m_json;
    LinePrinter m_printer;
    mutable std::mutex m_mutex;
    std::optional<std::size_t> m_left; // protected by m_mutex; nothing for no limit
};

ExitCode log(LogOptions const& chosen, GlobalOptions const& options)
{
    TrafficPrinter traffic(options.json);
    InterruptStop const stop;
    CarOptions carChoice = carOptions(options, stop.token());
    carChoice.onTraffic = [&traffic](obd::MessageDataModel const& entry) { traffic.print(entry); };
    Car car(carChoice);
    if (chosen.count > 0) {
        traffic.limit(chosen.count);
    }
    car.keepAsking(chosen.sensors);
    Clock::time_point const start = Clock::now();
    auto const done = [&] {
        bool const expired =
            chosen.duration > 0.0 && Clock::now() - start >= std::chrono::duration<double>(chosen.duration);
        return traffic.done() || expired || traffic.readerGone();
    };
    while (!done()) {
        std::this_thread::sleep_for(lookInterval);
        car.check();
    }
    traffic.finish();
    return ExitCode::Done;
}

} // namespace

void addLogCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<LogOptions>();
    CLI::App* const command =
        commandLine.addCommand("log", "Show the traffic with the adapter as it happens",
                               [chosen](GlobalOptions const& options) { return log(*chosen, options); });
    command->add_option("SENSOR", chosen->sensors,
                        "What to ask for meanwhile, named as for live; without, only the connection is kept up,\n"
                        "by a request every five seconds");
    command->add_option("-n,--count", chosen->count, "Stop N entries after the connection stands")
        ->type_name("N")
        ->check(CLI::Range(1UL, 1000000000UL));
    command->add_option("--duration", chosen->duration, "Stop S seconds after the connection stands")
        ->type_name("S")
        ->check(CLI::Range(0.001, 1e9));
}

} // namespace velmora::cli
