#include "bindings/c/cface.h"

#include <velmora/version.h>

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <limits>

namespace velmora::cface {

namespace {

// The car whose callback runs on this thread.
thread_local velmora_car const* calling = nullptr;

// Copies what the caller's compiler knew of the struct over the defaults.
velmora_options completed(velmora_options const* given)
{
    velmora_options options = VELMORA_OPTIONS_INIT;
    if (given != nullptr) {
        if (given->size < offsetof(velmora_options, baud)) {
            throw Error(ErrorKind::WrongUse, "velmora_options.size is not set", {"begin with VELMORA_OPTIONS_INIT"});
        }
        std::memcpy(&options, given, std::min(given->size, sizeof(options)));
    }
    return options;
}

std::string textOf(char const* text)
{
    return text != nullptr ? text : "";
}

// Notes whose callback runs for as long as it does.
class Calling
{
public:
    explicit Calling(velmora_car const* car) { calling = car; }
    ~Calling() { calling = nullptr; }
    Calling(Calling const&) = delete;
    Calling& operator=(Calling const&) = delete;
};

Units toUnits(uint32_t number)
{
    switch (number) {
    case VELMORA_UNITS_METRIC:
        return Units::Metric;
    case VELMORA_UNITS_IMPERIAL:
        return Units::Imperial;
    case VELMORA_UNITS_IMPERIAL_UK:
        return Units::ImperialUk;
    default:
        throw Error(ErrorKind::WrongUse, "velmora_options.units is one of VELMORA_UNITS_...");
    }
}

CarOptions carOptions(velmora_car const* car, char const* port, velmora_options const& given)
{
    CarOptions options;
    options.port = port;
    options.settingsFile = textOf(given.settings_file);
    options.logFile = textOf(given.log_file);
    options.traceFile = textOf(given.trace_file);
    options.reset = given.reset != 0;
    if (given.baud != 0) {
        options.baud = given.baud;
    }
    if (given.protocol != 0) {
        options.protocol = static_cast<int>(std::min<uint32_t>(given.protocol, 10));
    }
    if (given.module != 0) {
        options.module = given.module;
    }
    if (given.units != VELMORA_UNITS_BY_SETTINGS) {
        options.units = toUnits(given.units);
    }
    options.sleep = given.sleep != 0;
    if (given.on_progress != nullptr) {
        options.onProgress = [car, tell = given.on_progress, user = given.progress_user](std::string const& text) {
            Calling const noted(car);
            tell(text.c_str(), user);
        };
    }
    return options;
}

} // namespace

std::vector<std::string> sensorNames(char const* const* names, std::size_t count)
{
    std::vector<std::string> sensors;
    for (std::size_t index = 0; index < count; ++index) {
        require(names, "names");
        require(names[index], "a name");
        sensors.emplace_back(names[index]);
    }
    return sensors;
}

void tell(Reading const& reading, velmora_reading_fn fn, void* user)
{
    std::string const text = valueText(reading);
    velmora_reading plain{};
    plain.size = sizeof(plain);
    plain.sensor = reading.sensor.c_str();
    plain.pid = reading.pid.c_str();
    plain.name = reading.name.c_str();
    plain.text = text.c_str();
    plain.unit = reading.unit.c_str();
    plain.raw = reading.raw.data();
    plain.raw_size = reading.raw.size();
    plain.number = number(reading).value_or(std::numeric_limits<double>::quiet_NaN());
    plain.time_ns = std::chrono::duration_cast<std::chrono::nanoseconds>(reading.time.time_since_epoch()).count();
    plain.module = reading.module;
    plain.value = static_cast<uint32_t>(reading.value.index());
    fn(&plain, user);
}

} // namespace velmora::cface

using namespace velmora;

int velmora_abi_version(void)
{
    return VELMORA_ABI_VERSION;
}

char const* velmora_version(void)
{
    return VELMORA_VERSION;
}

int velmora_car_open(char const* port, velmora_options const* options, velmora_car** car, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(car, "car");
        *car = nullptr;
        cface::require(port, "port");
        auto made = std::make_unique<velmora_car>();
        made->car.emplace(cface::carOptions(made.get(), port, cface::completed(options)));
        *car = made.release();
    });
}

int velmora_car_close(velmora_car* car)
{
    if (car != nullptr && cface::calling == car) {
        return VELMORA_WRONG_USE;
    }
    return cface::guarded(nullptr, [car] { delete car; });
}

int velmora_car_reconnect(velmora_car* car, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(car, "car");
        car->car->reconnect();
    });
}

int velmora_car_read(velmora_car* car, char const* const* names, size_t count, velmora_reading_fn fn, void* user,
                     velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(car, "car");
        cface::require(reinterpret_cast<void const*>(fn), "fn");
        for (Reading const& reading : car->car->read(cface::sensorNames(names, count))) {
            cface::tell(reading, fn, user);
        }
    });
}

int velmora_car_watch(velmora_car* car, char const* const* names, size_t count, velmora_reading_fn on_reading,
                      velmora_link_fn on_link, void* user, velmora_watch** watch, velmora_error** error)
{
    return cface::guarded(error, [&] {
        cface::require(watch, "watch");
        *watch = nullptr;
        cface::require(car, "car");
        cface::require(reinterpret_cast<void const*>(on_reading), "on_reading");
        auto const onReading = [car, on_reading, user](Reading const& reading) {
            cface::Calling const noted(car);
            cface::tell(reading, on_reading, user);
        };
        Car::OnLink onLink;
        if (on_link != nullptr) {
            onLink = [car, on_link, user](LinkState state) {
                cface::Calling const noted(car);
                on_link(static_cast<int>(state), user);
            };
        }
        auto made = std::make_unique<velmora_watch>();
        made->watch = car->car->watch(cface::sensorNames(names, count), onReading, onLink);
        *watch = made.release();
    });
}

void velmora_watch_stop(velmora_watch* watch)
{
    delete watch;
}
