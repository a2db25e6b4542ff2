#include "bindings/c/cface.h"
#include "libvelmora/report/troublecode.h"

#include <velmora/catalogue.h>

#include <cstdlib>
#include <cstring>

namespace velmora::cface {

namespace {

uint32_t number(TopicAnswer answer)
{
    return static_cast<uint32_t>(answer);
}

uint32_t number(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Read:
        return VELMORA_ANSWER_READ;
    case CodeList::Answer::Refused:
        return list.offered ? VELMORA_ANSWER_REFUSED : VELMORA_ANSWER_NOT_OFFERED;
    case CodeList::Answer::Silent:
        return VELMORA_ANSWER_SILENT;
    case CodeList::Answer::Unreadable:
        return VELMORA_ANSWER_UNREADABLE;
    }
    return VELMORA_ANSWER_UNREADABLE;
}

uint32_t number(std::optional<bool> told)
{
    return !told ? VELMORA_UNTOLD : *told ? VELMORA_YES : VELMORA_NO;
}

uint32_t number(ReadinessStatus status)
{
    switch (status) {
    case ReadinessStatus::Complete:
        return VELMORA_MONITOR_COMPLETE;
    case ReadinessStatus::NotComplete:
        return VELMORA_MONITOR_NOT_COMPLETE;
    case ReadinessStatus::DisabledThisCycle:
        return VELMORA_MONITOR_DISABLED;
    case ReadinessStatus::NotAvailable:
        return VELMORA_MONITOR_NOT_AVAILABLE;
    }
    return VELMORA_MONITOR_UNTOLD;
}

// The struct with its size and the module that it is about.
template <typename Plain, typename Report>
Plain begun(ModuleTopic<Report> const& module)
{
    Plain plain{};
    plain.size = sizeof(plain);
    plain.module_name = module.name.c_str();
    plain.module = module.id;
    return plain;
}

void tell(ModuleTopic<CodeReport> const& module, velmora_code_fn fn, void* user)
{
    auto plain = begun<velmora_code>(module);
    plain.lamp = number(module.report.lamp);
    for (CodeList const& list : module.report.lists) {
        plain.kind = static_cast<uint32_t>(list.kind);
        plain.answer = number(list);
        plain.reason = list.reason.c_str();
        plain.code = plain.text = nullptr;
        if (list.codes.empty()) {
            fn(&plain, user);
        }
        for (TroubleCode const& code : list.codes) {
            std::string const text = meaningText(code);
            plain.code = code.code.c_str();
            plain.text = text.c_str();
            fn(&plain, user);
        }
    }
}

void tell(ModuleTopic<ReadinessReport> const& module, velmora_readiness_fn fn, void* user)
{
    auto plain = begun<velmora_readiness>(module);
    plain.answer = number(module.report.answer);
    plain.lamp = number(module.report.lamp);
    plain.since_cleared = plain.this_cycle = VELMORA_MONITOR_UNTOLD;
    if (module.report.monitors.empty()) {
        fn(&plain, user);
    }
    for (ReadinessMonitor const& monitor : module.report.monitors) {
        plain.name = monitor.name.c_str();
        plain.since_cleared = number(monitor.sinceCleared);
        plain.this_cycle = VELMORA_MONITOR_UNTOLD;
        if (monitor.thisCycle) {
            plain.this_cycle = number(*monitor.thisCycle);
        }
        fn(&plain, user);
    }
}

void tell(velmora_test plain, OnBoardMonitor const& monitor, velmora_test_fn fn, void* user)
{
    plain.monitor = monitor.description.c_str();
    plain.monitor_id = static_cast<uint32_t>(monitor.id);
    for (LimitTest const& test : monitor.tests) {
        plain.description = test.description.c_str();
        plain.value = test.value.c_str();
        plain.minimum = test.minimum.c_str();
        plain.maximum = test.maximum.c_str();
        plain.unit = test.unit.c_str();
        plain.test_id = static_cast<uint32_t>(test.id);
        plain.verdict = static_cast<uint32_t>(test.verdict);
        fn(&plain, user);
    }
}

void tell(ModuleTopic<MonitorsReport> const& module, velmora_test_fn fn, void* user)
{
    auto plain = begun<velmora_test>(module);
    plain.answer = number(module.report.answer);
    plain.description = plain.value = plain.minimum = plain.maximum = plain.unit = "";
    plain.verdict = VELMORA_TEST_NO_RESULT;
    bool told = false;
    for (OnBoardMonitor const& monitor : module.report.monitors) {
        tell(plain, monitor, fn, user);
        told = told || !monitor.tests.empty();
    }
    if (!told) {
        fn(&plain, user);
    }
}

// Tells what stands in an InfoReport, one call for each value.
class InfoTeller
{
public:
    InfoTeller(ModuleTopic<InfoReport> const& module, velmora_info_fn fn, void* user)
        : m_plain(begun<velmora_info>(module)), m_fn(fn), m_user(user)
    {}

    void tell(char const* key, std::string const& value, std::string const& unit = {})
    {
        if (!value.empty()) {
            m_plain.key = key;
            m_plain.value = value.c_str();
            m_plain.unit = unit.c_str();
            m_fn(&m_plain, m_user);
        }
    }

    void tell(char const* key, std::optional<InfoReport::Reading> const& reading)
    {
        if (reading) {
            tell(key, reading->value, reading->unit);
        }
    }

private:
    velmora_info m_plain;
    velmora_info_fn m_fn;
    void* m_user;
};

void tell(ModuleTopic<InfoReport> const& module, velmora_info_fn fn, void* user)
{
    InfoTeller teller(module, fn, user);
    InfoReport const& report = module.report;
    teller.tell("vin", report.vin);
    teller.tell("description", report.description);
    teller.tell("standard", report.standard);
    teller.tell("protocol", report.protocol);
    for (InfoReport::Calibration const& calibration : report.calibrations) {
        teller.tell("calibration", calibration.id);
        teller.tell("verification", calibration.verification);
    }
    teller.tell("engine_serial_number", report.engineSerialNumber);
    teller.tell("type_approval", report.erotan);
    teller.tell("distance_with_lamp", report.withLamp.distance);
    teller.tell("time_with_lamp", report.withLamp.runTime);
    teller.tell("distance_since_cleared", report.sinceCleared.distance);
    teller.tell("time_since_cleared", report.sinceCleared.runTime);
}

void tell(ModuleTopic<ClearReport> const& module, velmora_cleared_fn fn, void* user)
{
    auto plain = begun<velmora_cleared>(module);
    plain.reason = module.report.reason.c_str();
    plain.result = static_cast<uint32_t>(module.report.result);
    fn(&plain, user);
}

void tell(ModuleTopic<CountersReport> const& module, velmora_counter_fn fn, void* user)
{
    auto plain = begun<velmora_counter>(module);
    plain.answer = number(module.report.answer);
    if (module.report.counters.empty()) {
        fn(&plain, user);
    }
    for (CountersReport::Counter const& counter : module.report.counters) {
        plain.name = counter.name.c_str();
        plain.value = counter.value;
        fn(&plain, user);
    }
}

void tell(Module const& module, velmora_module_fn fn, void* user)
{
    velmora_module const plain{sizeof(plain), module.name.c_str(), module.description.c_str(), module.id, 0};
    fn(&plain, user);
}

void tell(Sensor const& sensor, velmora_sensor_fn fn, void* user)
{
    velmora_sensor const plain{sizeof(plain),        sensor.key.c_str(), sensor.pid.c_str(),
                               sensor.title.c_str(), sensor.module,      0};
    fn(&plain, user);
}

// What a function of the car gives, item by item.
template <typename Read, typename Function>
int tellEach(velmora_car* car, Read const& read, Function fn, void* user, velmora_error** error)
{
    return guarded(error, [&] {
        require(car, "car");
        require(reinterpret_cast<void const*>(fn), "fn");
        for (auto const& item : read(*car->car)) {
            tell(item, fn, user);
        }
    });
}

// In memory that velmora_free gives back.
char* copyOf(std::string const& text)
{
    auto* const copy = static_cast<char*>(std::malloc(text.size() + 1));
    if (copy == nullptr) {
        throw std::bad_alloc();
    }
    std::memcpy(copy, text.c_str(), text.size() + 1);
    return copy;
}

} // namespace

} // namespace velmora::cface

using namespace velmora;

int velmora_car_modules(velmora_car* car, velmora_module_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.modules(); }, fn, user, error);
}

int velmora_car_sensors(velmora_car* car, velmora_sensor_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.sensors(); }, fn, user, error);
}

int velmora_car_codes(velmora_car* car, velmora_code_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.codeReports(); }, fn, user, error);
}

int velmora_car_readiness(velmora_car* car, velmora_readiness_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.readiness(); }, fn, user, error);
}

int velmora_car_monitors(velmora_car* car, velmora_test_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.monitors(); }, fn, user, error);
}

int velmora_car_info(velmora_car* car, velmora_info_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.info(); }, fn, user, error);
}

int velmora_car_clear(velmora_car* car, uint32_t flags, velmora_cleared_fn fn, void* user, velmora_error** error)
{
    if (flags != VELMORA_CLEAR_ERASES_READINESS) {
        return cface::fail(error, VELMORA_WRONG_USE, "Clearing also erases readiness and freeze frames",
                           {"pass VELMORA_CLEAR_ERASES_READINESS if that is meant"});
    }
    return cface::tellEach(
        car, [](Car& each) { return each.clearCodes(); }, fn, user, error);
}

int velmora_car_counters(velmora_car* car, velmora_counter_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(
        car, [](Car& each) { return each.counters(); }, fn, user, error);
}

int velmora_car_report_json(velmora_car* car, char** json, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(json, "json");
        *json = nullptr;
        cface::require(car, "car");
        *json = cface::copyOf(car->car->report().toJson());
    });
}

int velmora_catalogue_find(char const* code, velmora_meaning_fn fn, void* user, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(code, "code");
        cface::require(reinterpret_cast<void const*>(fn), "fn");
        TroubleCode const found = explain(code);
        for (TroubleCode::Meaning const& meaning : found.meanings) {
            velmora_meaning const plain{sizeof(plain), found.code.c_str(), meaning.maker.c_str(), meaning.text.c_str(),
                                        found.system.c_str()};
            fn(&plain, user);
        }
    });
}
