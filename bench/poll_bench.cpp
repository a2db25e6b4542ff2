// Live values by the poller, in real time: six sensors of one module that answers in 10 ms, behind an
// adapter with the byte times of a line rate that waits so many milliseconds for more replies.
//
// values_per_s: what reaches the application in steady state, from the third second on. cpu_percent: of one core, the
// simulated car included.

#include "libvelmora/poll/vehiclepoll.h"
#include "libvelmora/session/session.h"
#include "simulator/server.h"
#include "simulator/simulation.h"

#include <benchmark/benchmark.h>

#include <atomic>
#include <chrono>
#include <string>
#include <sys/resource.h>
#include <thread>

namespace {

using namespace velmora;

constexpr std::chrono::seconds settling{2};
constexpr std::chrono::seconds measured{5};

double cpuSeconds()
{
    rusage usage{};
    ::getrusage(RUSAGE_SELF, &usage);
    auto const seconds = [](timeval const& time) {
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
    };
    return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

void poll(benchmark::State& state, PollWill const& will, obdsim::SimulationOptions const& car)
{
    auto const server = obdsim::serveTcp(obdsim::simulate(car), "127.0.0.1", 0);
    server->start();
    SessionOptions options;
    options.port = "tcp://" + server->address();
    options.settingsFile = "/nonexistent";
    std::vector<std::string> const sensors{"0C", "0D", "05", "04", "11", "0F"};
    for ([[maybe_unused]] auto const once : state) {
        Session session(options);
        session.connect();
        std::atomic<unsigned int> values{0};
        auto const choices = choosePolled(sensors, moduleOffers(session.obd(), {}), std::nullopt);
        auto const poller = pollVehicle(session.obd(), choices, will, [&](PollResult const& result) {
            values += static_cast<unsigned int>(result.readings.size());
        });
        std::this_thread::sleep_for(settling);
        unsigned int const before = values;
        double const cpu = cpuSeconds();
        std::this_thread::sleep_for(measured);
        auto const length = static_cast<double>(measured.count());
        state.counters["values_per_s"] = (values - before) / length;
        state.counters["cpu_percent"] = 100.0 * (cpuSeconds() - cpu) / length;
    }
}

void registerAll()
{
    struct Mode
    {
        char const* name;
        PollWill will;
    };
    Mode const modes[] = {{"default", {false, 1}}, {"fast", {true, 1}}, {"fast_six", {true, 6}}};
    struct Adapter
    {
        char const* name;
        obdsim::SimulationOptions options;
    };
    Adapter const adapters[] = {
        {"38400_wait50", {"bench-can11", "elm327-v1.5", {"command=0", "baud=38400", "wait=50"}}},
        {"38400_wait400", {"bench-can11", "elm327-v1.5", {"command=0", "baud=38400", "wait=400"}}},
        {"38400_adaptive", {"bench-can11", "elm327-v1.5", {"command=0", "baud=38400"}}},
        {"115200_adaptive", {"bench-can11", "elm327-v1.5", {"command=0", "baud=115200"}}},
        {"petrol_can11_38400", {"petrol-can11", "elm327-v1.5", {"baud=38400"}}},
    };
    for (Adapter const& adapter : adapters) {
        for (Mode const& mode : modes) {
            benchmark::RegisterBenchmark(
                (std::string(mode.name) + "/" + adapter.name).c_str(),
                [mode, adapter](benchmark::State& state) { poll(state, mode.will, adapter.options); })
                ->Iterations(1)
                ->UseRealTime();
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
