#include "libvelmora/read/sensorchoice.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/lineprinter.h"
#include "program/view/trafficlog.h"

#include <obd/isensorservice.h>
#include <obd/itroublecodeservice.h>
#include <obd/itroubleshootingservice.h>
#include <tervex/observer.h>

#include <chrono>
#include <mutex>
#include <optional>

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

// Prints the traffic from its construction on, that of connecting too.
class TrafficLog : public tervex::Observer<obd::ITroubleshootingServiceObserver>
{
public:
    explicit TrafficLog(bool json)
        : m_json(json), m_service(obd::TroubleshootingServiceBuilder::createTroubleshootingService())
    {
        m_service->attach(this);
        m_service->startLogging();
    }
    ~TrafficLog() override = default;
    TrafficLog(TrafficLog const&) = delete;
    TrafficLog& operator=(TrafficLog const&) = delete;

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

    // Ends with what was logged so far. Throws Error if it can't be printed.
    void finish()
    {
        m_service.reset();
        m_printer.finish();
    }

private:
    void onLogEntryAdded(std::shared_ptr<obd::MessageDataModel> const& entry) override
    {
        std::lock_guard const lock(m_mutex);
        if (m_left == std::size_t{0}) {
            return;
        }
        m_printer.print(m_json ? toJsonLine(*entry) : toLine(*entry));
        if (m_left) {
            --*m_left;
        }
    }

    bool const m_json;
    LinePrinter m_printer;
    mutable std::mutex m_mutex;
    std::optional<std::size_t> m_left; // protected by m_mutex; nothing for no limit
    // Its end waits for an entry that is under way on another thread, which detaching would not.
    std::shared_ptr<obd::ITroubleshootingService> m_service;
};

// Asks for the sensors over and over. Without any it asks once for the lamp: from its first request on the library
// keeps an idle connection up, by one every five seconds.
void startTraffic(std::vector<std::string> const& names, obd::ISensorService& service)
{
    if (names.empty()) {
        obd::TroubleCodeServiceBuilder::createTroubleCodeService()->askMilStatus();
    } else {
        service.startUpdates(chooseSensors(names, offeredSensors(service)));
    }
}

ExitCode log(LogOptions const& chosen, GlobalOptions const& options)
{
    CommandSession session(options);
    TrafficLog traffic(options.json);
    session.connect();
    auto const sensors = obd::SensorServiceBuilder::createSensorService();
    if (chosen.count > 0) {
        traffic.limit(chosen.count);
    }
    startTraffic(chosen.sensors, *sensors);
    Clock::time_point const start = Clock::now();
    auto const done = [&] {
        bool const expired =
            chosen.duration > 0.0 && Clock::now() - start >= std::chrono::duration<double>(chosen.duration);
        return traffic.done() || expired || traffic.readerGone();
    };
    while (!done()) {
        Clock::time_point const limit = Clock::now() + lookInterval;
        session.loop().runUntil([&] { return Interrupt::instance().raised() || Clock::now() >= limit; }, limit);
        session.check();
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
