// What one update of a parameter costs beside the bus: request bytes, expected beginning, decoding. The proxy hands out
// a prepared reply map, whose copying is part of the figure, as the parser's filling of it is on the real road.

#include "bench/allocationcount.h"
#include "libobd/module/obdproxy.h"
#include "tests/support/wire/fakedevice.h"

#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>

#include <benchmark/benchmark.h>

namespace {

constexpr unsigned int module = 0x7E8;

std::shared_ptr<obd::ObdProxy> connectedProxy(std::shared_ptr<support::FakeDevice> const& device)
{
    device->answer({0x01, 0x00}, module, {0x41, 0x00, 0x00, 0x10, 0x00, 0x00});
    device->answer({0x01, 0x0C}, module, {0x41, 0x0C, 0x1A, 0xF8});
    auto proxy = std::make_shared<obd::ObdProxy>();
    proxy->setDevice(device);
    proxy->initialize();
    return proxy;
}

void updateEngineSpeed(benchmark::State& state)
{
    auto const device = std::make_shared<support::FakeDevice>();
    auto const proxy = connectedProxy(device);
    auto const parameter = obd::ParameterFactory().createParameter(obd::ParameterIdentifier(0x0C).id());
    std::size_t const before = bench::allocationCount();
    for (auto _ : state) {
        benchmark::DoNotOptimize(parameter->update(proxy));
        device->requests.clear();
        device->timeouts.clear();
    }
    state.counters["allocations"] =
        benchmark::Counter(static_cast<double>(bench::allocationCount() - before), benchmark::Counter::kAvgIterations);
    proxy->releaseEcus();
}

} // namespace

BENCHMARK(updateEngineSpeed);
