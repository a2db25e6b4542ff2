// What a user can reach, in real time and end to end: over TCP to a simulated adapter with the byte times of a line
// rate, which listens for so many milliseconds behind each reply. "plain" is the library's own dialogue, byte for byte;
// "default" and the rest go through the companion's channel.
//
// values_per_s: what reaches the application in steady state, six sensors of one module. cpu_percent: of one core,
// without the simulated car, which is a process of its own. Bring-up and scan: seconds. The adapter's own time for a
// command is 0.

#include "bench/carprocess.h"
#include "libvelmora/channel/portwire.h"
#include "libvelmora/poll/vehiclepoll.h"
#include "libvelmora/port/opening/openport.h"
#include "libvelmora/read/vehiclereader.h"
#include "libvelmora/session/session.h"
#include "tests/support/wire/plainchannel.h"

#include <benchmark/benchmark.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <string>
#include <sys/resource.h>
#include <thread>
#include <unistd.h>

namespace {

using namespace velmora;
using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds settling{6}; // habits of adapter and modules are learnt by then
constexpr std::chrono::seconds measured{5};

// A folder for what is learnt, empty at the start.
class Visits
{
public:
    Visits() { std::filesystem::create_directories(m_folder); }
    ~Visits() { std::filesystem::remove_all(m_folder); }
    Visits(Visits const&) = delete;
    Visits& operator=(Visits const&) = delete;

    std::string settings() const { return (m_folder / "settings.toml").string(); }

private:
    std::filesystem::path m_folder =
        std::filesystem::temp_directory_path() / ("velmora-reach-" + std::to_string(::getpid()));
};

enum class Way
{
    Plain,
    Default,
    FastSingle,
    FastBroadcast, // six PIDs
    FastSix,       // by a physical header where that pays
};

struct Row
{
    std::string adapter;
    obdsim::SimulationOptions car;
    std::vector<std::string> commands; // to the adapter, once the connection stands
    bool isObedient = false;           // waits as ATST says
};

SessionOptions optionsFor(std::string const& address, Way way, std::string const& settings)
{
    SessionOptions options;
    options.port = "tcp://" + address;
    options.settingsFile = settings;
    if (way == Way::Plain) {
        options.makeChannel = [](std::shared_ptr<IWire> const& wire) {
            return std::make_shared<support::PlainChannel>(wire);
        };
    }
    return options;
}

// Switches the adaptive wait off, before anybody else talks to the adapter.
void prepare(Row const& row, std::string const& address)
{
    if (row.isObedient) {
        PortWire wire(openPort(parsePortAddress("tcp://" + address)));
        wire.write("ATAT0\r");
        wire.read(wire.now() + WireTime(500));
    }
}

double cpuSeconds()
{
    rusage usage{};
    ::getrusage(RUSAGE_SELF, &usage);
    auto const seconds = [](timeval const& time) {
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
    };
    return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

void values(benchmark::State& state, Way way, Row const& row)
{
    std::vector<std::string> const sensors{"0C", "0D", "05", "04", "11", "0F"};
    bool const fast = way != Way::Plain && way != Way::Default;
    PollWill const will{fast, way == Way::FastSingle ? 1U : 6U};
    for ([[maybe_unused]] auto const once : state) {
        Visits const visits;
        CarProcess const car(row.car);
        prepare(row, car.address());
        Session session(optionsFor(car.address(), way, visits.settings()));
        session.connect();
        for (std::string const& command : row.commands) {
            std::string reply;
            session.proxy()->execute(command, reply, 1000);
        }
        std::atomic<unsigned int> count{0};
        auto const choices = choosePolled(sensors, moduleOffers(session.obd(), {}), std::nullopt);
        auto const poller = pollVehicle(
            session.obd(), choices, will, Units::Metric,
            [&](PollResult const& result) { count += static_cast<unsigned int>(result.readings.size()); },
            way == Way::FastBroadcast ? nullptr : &session.channel());
        std::this_thread::sleep_for(settling);
        unsigned int const before = count;
        double const cpu = cpuSeconds();
        std::this_thread::sleep_for(measured);
        auto const length = static_cast<double>(measured.count());
        state.counters["values_per_s"] = (count - before) / length;
        state.counters["cpu_percent"] = 100.0 * (cpuSeconds() - cpu) / length;
    }
}

double secondsSince(Clock::time_point start)
{
    return std::chrono::duration<double>(Clock::now() - start).count();
}

// Twice in a row, with what the first visit has learnt: connects, and does what else a visit is for.
template <typename Rest>
void visitTwice(benchmark::State& state, Way way, Row const& row, Rest const& rest)
{
    for ([[maybe_unused]] auto const once : state) {
        Visits const visits;
        CarProcess const car(row.car);
        prepare(row, car.address());
        for (char const* visit : {"first_s", "second_s"}) {
            Session session(optionsFor(car.address(), way, visits.settings()));
            Clock::time_point const start = Clock::now();
            session.connect();
            rest(session);
            state.counters[visit] = secondsSince(start);
        }
    }
}

void bringUp(benchmark::State& state, Way way, Row const& row)
{
    visitTwice(state, way, row, [](Session& /*session*/) {});
}

void scan(benchmark::State& state, Way way, Row const& row)
{
    visitTwice(state, way, row, [](Session& session) { benchmark::DoNotOptimize(readVehicle(session)); });
}

Row rowOf(std::string const& vehicle, std::string const& baud, std::string const& wait)
{
    std::string const name = vehicle + "/" + baud + "/W" + wait;
    return {name, {vehicle, "elm327-v1.5", {"command=0", "baud=" + baud, "wait=" + wait}}, {}, false};
}

// An adapter that obeys ATST and does not adapt its wait; setWait may be empty for what the library sets, 400 ms.
Row obedient(std::string const& baud, std::string const& wait, std::string const& setWait = {})
{
    std::vector<std::string> commands;
    if (!setWait.empty()) {
        commands.push_back(setWait);
    }
    return {"bench-can11/" + baud + "/ATST" + wait,
            {"bench-can11", "elm327-v1.5", {"command=0", "baud=" + baud}},
            commands,
            true};
}

template <typename Measure>
void add(std::string const& name, Row const& row, Way way, Measure measure)
{
    benchmark::RegisterBenchmark((name + "/" + row.adapter).c_str(),
                                 [=](benchmark::State& state) { measure(state, way, row); })
        ->Iterations(1)
        ->UseRealTime()
        ->Unit(benchmark::kSecond);
}

void registerAll()
{
    for (std::string const baud : {"38400", "115200"}) {
        for (Row const& row : {rowOf("bench-can11", baud, "50"), rowOf("bench-can11", baud, "400"),
                               obedient(baud, "50", "ATST0D"), obedient(baud, "400")}) {
            add("live_plain", row, Way::Plain, values);
            add("live", row, Way::Default, values);
        }
        add("fast_single", rowOf("bench-can11", baud, "50"), Way::FastSingle, values);
        add("fast_six", rowOf("bench-can11", baud, "50"), Way::FastSix, values);
        add("plain", rowOf("petrol-can11", baud, "50"), Way::Plain, values);
        add("fast_six_broadcast", rowOf("petrol-can11", baud, "50"), Way::FastBroadcast, values);
        add("fast_six_physical", rowOf("petrol-can11", baud, "50"), Way::FastSix, values);
        for (Row const& row :
             {rowOf("bench-can11", baud, "50"), rowOf("bench-can11", baud, "400"), obedient(baud, "400")}) {
            for (Way const way : {Way::Plain, Way::Default}) {
                std::string const suffix = way == Way::Plain ? "_plain" : "";
                add("bring_up" + suffix, row, way, bringUp);
                add("scan" + suffix, row, way, scan);
            }
        }
    }
}

} // namespace

int main(int argc, char** argv)
{
    benchmark::Initialize(&argc, argv);
    registerAll();
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
