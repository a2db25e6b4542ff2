// The vehicle itself: its modules, their sensors, what they tell of themselves, and all of it as a report.

#include "bindings/c/telltopic.h"

#include <cstdlib>
#include <cstring>

namespace velmora::cface {

namespace {

void tellModule(Module const& module, velmora_module_fn fn, void* user)
{
    velmora_module const plain{sizeof(plain), module.name.c_str(), module.description.c_str(), module.id, 0};
    fn(&plain, user);
}

void tellSensor(Sensor const& sensor, velmora_sensor_fn fn, void* user)
{
    velmora_sensor const plain{sizeof(plain),        sensor.key.c_str(), sensor.pid.c_str(),
                               sensor.title.c_str(), sensor.module,      0};
    fn(&plain, user);
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

void tellInfo(ModuleTopic<InfoReport> const& module, velmora_info_fn fn, void* user)
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
    return cface::tellEach(car, &Car::modules, cface::tellModule, fn, user, error);
}

int velmora_car_sensors(velmora_car* car, velmora_sensor_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(car, &Car::sensors, cface::tellSensor, fn, user, error);
}

int velmora_car_info(velmora_car* car, velmora_info_fn fn, void* user, velmora_error** error)
{
    return cface::tellEach(car, &Car::info, cface::tellInfo, fn, user, error);
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
