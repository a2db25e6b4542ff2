// The cycle of live values, with the system's clock and an adapter that answers at once: a simulated car whose waits
// are jumps of its own clock. So a reading takes the floor of 30 ms, and the rest is the library's and the
// application's.
//
// readings_per_s: 33.3 at the best. cpu_percent: of one core, the simulated car included. lost_percent: the time that
// passes between the end of a reading on the worker and the next request, for the way by the application's thread; with
// one parameter nothing else is queued meanwhile, and the worker polls the empty queue every 10 ms.

#include "libvelmora/session/cyclemeter.h"
#include "libvelmora/session/dispatchloop.h"
#include "simulator/simulation.h"
#include "tests/support/memorysettings.h"
#include "tests/support/wire/peerconnection.h"

#include <obd/iconnectionmanager.h>
#include <obd/iobdvelmora.h>
#include <obd/isensorservice.h>
#include <obd/obdvelmorabuilder.h>
#include <obd/parameterdescriptor.h>

#include <benchmark/benchmark.h>

#include <sys/resource.h>

namespace {

class Counter : public tervex::Observer<obd::ISensorServiceObserver>
{
public:
    void onSensorUpdated(bool /*success*/, std::shared_ptr<obd::ParameterDescriptor> const& /*descriptor*/,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& /*values*/) override
    {
        ++readings;
    }

    int readings = 0;
};

double cpuSeconds()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    auto const seconds = [](timeval const& time) {
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) / 1e6;
    };
    return seconds(usage.ru_utime) + seconds(usage.ru_stime);
}

std::vector<obd::ParameterIdentifier::Id> firstIds(obd::ISensorService& service, std::size_t count)
{
    std::vector<obd::ParameterIdentifier::Id> ids;
    for (auto const& descriptor : service.getDescriptors()) {
        if (ids.size() < count) {
            ids.push_back(obd::ParameterIdentifier(descriptor->pid()).id());
        }
    }
    return ids;
}

void cycle(benchmark::State& state)
{
    using Clock = std::chrono::steady_clock;
    velmora::DispatchLoop loop;
    auto const obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
    auto const car = std::make_shared<PeerConnection>(obdsim::simulate({"petrol-can11", "elm327-v1.5", {}}));
    obd::IConnectionManager& manager = *obd->getConnectionManager();
    if (!manager.openConnection(car, obd::VehicleProtocol::Automatic, false)) {
        state.SkipWithError("no connection");
        return;
    }
    loop.runUntil([] { return false; }, Clock::now() + std::chrono::milliseconds(100));
    auto const service = obd::SensorServiceBuilder::createSensorService();
    Counter counter;
    service->attach(&counter);
    double elapsed = 0;
    double cpu = 0;
    double lost = 0;
    for ([[maybe_unused]] auto _ : state) {
        velmora::CycleTap const tap(manager, loop);
        auto const begin = Clock::now();
        double const cpuBefore = cpuSeconds();
        service->startUpdates(firstIds(*service, static_cast<std::size_t>(state.range(0))));
        loop.runUntil([] { return false; }, begin + std::chrono::seconds(10));
        service->reset();
        cpu += cpuSeconds() - cpuBefore;
        elapsed += std::chrono::duration<double>(Clock::now() - begin).count();
        lost += tap.meter().lostShare();
    }
    state.counters["readings_per_s"] = counter.readings / elapsed;
    state.counters["cpu_percent"] = 100 * cpu / elapsed;
    state.counters["lost_percent"] = 100 * lost / static_cast<double>(state.iterations());
    service->detach(&counter);
    manager.closeConnection();
}
BENCHMARK(cycle)->Arg(1)->Arg(2)->Arg(5)->Arg(40)->Iterations(1)->UseRealTime()->Unit(benchmark::kSecond);

} // namespace
