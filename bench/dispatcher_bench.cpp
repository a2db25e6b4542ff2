// What the worker costs, with an adapter that answers at once and the system's clock.
//
// Fetch: from the call to its return. The queue's poll (up to 10 ms) and the floor of a success (30 ms) are waits by
// design, so a fetch takes 30 to 40 ms, a failing one up to 10 ms; all beyond that is cost.
// RoundTrip: one piece of work through queue, worker and dispatch, while the worker finds more to do and does not poll.
// Idle: a second without work. cpu_percent is the share of one core, wakeups_per_s the voluntary context switches of
// the process without those of the benchmark's own sleep.

#include "libobd/dispatch/fetcher.h"

#include <obd/iobdproxy.h>
#include <obd/iquery.h>

#include <benchmark/benchmark.h>

#include <sys/resource.h>
#include <thread>
#include <vector>

namespace {

// A standing link whose exchanges end at once.
class InstantProxy : public obd::IObdProxy
{
public:
    void setDevice(std::shared_ptr<obd::IDevice> /*device*/) override {}
    bool initialize() override { return true; }
    bool isConnected() override { return true; }
    obd::ObdProtocol protocol() override { return obd::ObdProtocolCan11; }
    std::vector<std::shared_ptr<obd::IEcu>> ecus() override { return {}; }
    std::shared_ptr<obd::IEcu> firstEcu() override { return nullptr; }
    std::shared_ptr<obd::IEcu> ecu(unsigned int /*id*/) override { return nullptr; }
    obd::IDevice::Status execute(std::string const& /*command*/, std::string& /*response*/,
                                 unsigned int /*timeoutMs*/) override
    {
        return obd::IDevice::Status::Ok;
    }
    obd::IDevice::Status execute(std::vector<unsigned char> const& /*request*/, obd::ResponseMap& /*responses*/,
                                 unsigned int /*timeoutMs*/) override
    {
        return obd::IDevice::Status::Ok;
    }
    float batteryVoltage() override { return 0.0F; }
};

class InstantQuery : public obd::IQuery
{
public:
    explicit InstantQuery(UpdateStatus status) : m_status(status) {}

    UpdateStatus update(std::shared_ptr<obd::IObdProxy> const& /*proxy*/) override { return m_status; }
    unsigned int timeout() const override { return 1000; }
    void clear() override {}

private:
    UpdateStatus m_status;
};

class EmptyWork : public obd::IDispatchable
{
public:
    void execute(std::shared_ptr<obd::IObdProxy> const& /*proxy*/) override {}
    void finish() override { ++finished; }

    int finished = 0;
};

// The Dispatcher connected for the length of a benchmark.
class Connected
{
public:
    Connected() { obd::Dispatcher::getInstance().setProxy(std::make_shared<InstantProxy>()); }
    ~Connected()
    {
        obd::Dispatcher::getInstance().cancel();
        obd::Dispatcher::getInstance().setProxy(nullptr);
    }
    Connected(Connected const&) = delete;
    Connected& operator=(Connected const&) = delete;
};

void fetches(benchmark::State& state, obd::IQuery::UpdateStatus status)
{
    Connected const connected;
    auto const query = std::make_shared<InstantQuery>(status);
    for ([[maybe_unused]] auto _ : state) {
        benchmark::DoNotOptimize(obd::fetch(query));
        obd::Dispatcher::getInstance().dispatch();
    }
}
BENCHMARK_CAPTURE(fetches, Success, obd::IQuery::UpdateStatus::UpdateOk)->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(fetches, Failure, obd::IQuery::UpdateStatus::UpdateFailed)
    ->UseRealTime()
    ->Unit(benchmark::kMillisecond);

void roundTrip(benchmark::State& state)
{
    constexpr int batch = 10000;
    Connected const connected;
    auto const work = std::make_shared<EmptyWork>();
    obd::Dispatcher& dispatcher = obd::Dispatcher::getInstance();
    for ([[maybe_unused]] auto _ : state) {
        int const target = work->finished + batch;
        for (int i = 0; i < batch; ++i) {
            dispatcher.update(work);
        }
        while (work->finished < target) {
            dispatcher.dispatch();
        }
    }
    state.SetItemsProcessed(state.iterations() * batch);
}
BENCHMARK(roundTrip)->UseRealTime()->Unit(benchmark::kMillisecond);

double seconds(timeval const& time)
{
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) / 1e6;
}

void idle(benchmark::State& state)
{
    Connected const connected;
    auto const work = std::make_shared<EmptyWork>();
    obd::Dispatcher::getInstance().update(work);
    double cpu = 0;
    long wakeups = 0;
    for ([[maybe_unused]] auto _ : state) {
        rusage before{};
        rusage after{};
        getrusage(RUSAGE_SELF, &before);
        std::this_thread::sleep_for(std::chrono::seconds(1));
        getrusage(RUSAGE_SELF, &after);
        cpu += seconds(after.ru_utime) - seconds(before.ru_utime) + seconds(after.ru_stime) - seconds(before.ru_stime);
        wakeups += after.ru_nvcsw - before.ru_nvcsw - 1;
    }
    auto const rounds = static_cast<double>(state.iterations());
    state.counters["cpu_percent"] = 100 * cpu / rounds;
    state.counters["wakeups_per_s"] = static_cast<double>(wakeups) / rounds;
}
BENCHMARK(idle)->Iterations(3)->UseRealTime()->Unit(benchmark::kMillisecond);

} // namespace
