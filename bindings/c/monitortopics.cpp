// What the monitors of the emission system say: how far they have come, how often they ran, and with what results.

#include "bindings/c/telltopic.h"

namespace velmora::cface {

namespace {

void tellReadiness(ModuleTopic<ReadinessReport> const& module, velmora_readiness_fn fn, void* user)
{
    auto plain = begun<velmora_readiness>(module);
    plain.answer = numberOf(module.report.answer);
    plain.lamp = numberOf(module.report.lamp);
    plain.since_cleared = plain.this_cycle = VELMORA_MONITOR_UNTOLD;
    if (module.report.monitors.empty()) {
        fn(&plain, user);
    }
    for (ReadinessMonitor const& monitor : module.report.monitors) {
        plain.name = monitor.name.c_str();
        plain.since_cleared = numberOf(monitor.sinceCleared);
        plain.this_cycle = VELMORA_MONITOR_UNTOLD;
        if (monitor.thisCycle) {
            plain.this_cycle = numberOf(*monitor.thisCycle);
        }
        fn(&plain, user);
    }
}

void tellTests(velmora_test plain, OnBoardMonitor const& monitor, velmora_test_fn fn, void* user)
{
    plain.monitor = monitor.description.c_str();
    plain.monitor_id = static_cast<std::uint32_t>(monitor.id);
    for (LimitTest const& test : monitor.tests) {
        plain.description = test.description.c_str();
        plain.value = test.value.c_str();
        plain.minimum = test.minimum.c_str();
        plain.maximum = test.maximum.c_str();
        plain.unit = test.unit.c_str();
        plain.test_id = static_cast<std::uint32_t>(test.id);
        plain.verdict = static_cast<std::uint32_t>(test.verdict);
        fn(&plain, user);
    }
}

void tellMonitors(ModuleTopic<MonitorsReport> const& module, velmora_test_fn fn, void* user)
{
    auto plain = begun<velmora_test>(module);
    plain.answer = numberOf(module.report.answer);
    plain.description = plain.value = plain.minimum = plain.maximum = plain.unit = "";
    plain.verdict = VELMORA_TEST_NO_RESULT;
    bool told = false;
    for (OnBoardMonitor const& monitor : module.report.monitors) {
        tellTests(plain, monitor, fn, user);
        told = told || !monitor.tests.empty();
    }
    if (!told) {
        fn(&plain, user);
    }
}

void tellCounters(ModuleTopic<CountersReport> const& module, velmora_counter_fn fn, void* user)
{
    auto plain = begun<velmora_counter>(module);
    plain.answer = numberOf(module.report.answer);
    if (module.report.counters.empty()) {
        fn(&plain, user);
    }
    for (CountersReport::Counter const& counter : module.report.counters) {
        plain.name = counter.name.c_str();
        plain.value = counter.value;
        fn(&plain, user);
    }
}

} // namespace

} // namespace velmora::cface

using namespace velmora;

int velmora_car_readiness(velmora_car* car, velmora_readiness_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(car, &Car::readiness, cface::tellReadiness, fn, user, error);
}

int velmora_car_monitors(velmora_car* car, velmora_test_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(car, &Car::monitors, cface::tellMonitors, fn, user, error);
}

int velmora_car_counters(velmora_car* car, velmora_counter_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(car, &Car::counters, cface::tellCounters, fn, user, error);
}
