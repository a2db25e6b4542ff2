// The whole report of the petrol car, with the system's clock and an adapter that answers at once.
//
// waits_ms: what the dialogue itself prescribes between a reply and the next request: 200 ms behind a command to the
// adapter, which may have more to say, and 30 ms behind a request of a service. over_ms: all the rest.

#include "libvelmora/read/vehiclereader.h"

#include <obd/iconnectionmanager.h>
#include <obd/idataconnection.h>

#include <benchmark/benchmark.h>

#include <atomic>
#include <chrono>

namespace {

using namespace velmora;
using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

// Sums up the prescribed part of each pause of the host.
class Pauses : public obd::IConnectionLogger
{
public:
    void onDataSent(std::vector<unsigned char> const& /*data*/) override
    {
        Clock::duration const pause = Clock::now() - m_replied.load();
        m_prescribed += pause >= milliseconds(200) ? 200 : pause >= milliseconds(30) ? 30 : 0;
        ++m_requests;
    }

    void onDataReceived(std::vector<unsigned char> const& /*data*/) override { m_replied = Clock::now(); }

    int prescribedMs() const { return m_prescribed; }
    int requests() const { return m_requests; }

private:
    std::atomic<Clock::time_point> m_replied{Clock::now()};
    std::atomic<int> m_prescribed{0};
    std::atomic<int> m_requests{0};
};

void scan(benchmark::State& state)
{
    SessionOptions options;
    options.port = "sim:petrol-can11?instant";
    options.settingsFile = "/nonexistent";
    for ([[maybe_unused]] auto const once : state) {
        Clock::time_point const start = Clock::now();
        Pauses pauses;
        Session session(options);
        session.obd().getConnectionManager()->addLogger(&pauses);
        session.connect();
        benchmark::DoNotOptimize(readVehicle(session));
        std::chrono::duration<double, std::milli> const total = Clock::now() - start;
        session.obd().getConnectionManager()->removeLogger(&pauses);
        state.counters["requests"] = pauses.requests();
        state.counters["waits_ms"] = pauses.prescribedMs();
        state.counters["over_ms"] = total.count() - pauses.prescribedMs();
    }
}

} // namespace

BENCHMARK(scan)->Iterations(1)->Unit(benchmark::kMillisecond)->UseRealTime();
