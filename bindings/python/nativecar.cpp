#include "bindings/python/nativecar.h"

#include <pybind11/stl.h>

namespace py = pybind11;

namespace velmora::python {

namespace {

template <typename Value>
void take(py::dict const& options, char const* name, Value& target)
{
    if (options.contains(name) && !options[name].is_none()) {
        target = options[name].cast<Value>();
    }
}

template <typename Value>
void take(py::dict const& options, char const* name, std::optional<Value>& target)
{
    if (options.contains(name) && !options[name].is_none()) {
        target = options[name].cast<Value>();
    }
}

Units toUnits(std::string const& text)
{
    if (text == "metric") {
        return Units::Metric;
    }
    if (text == "imperial") {
        return Units::Imperial;
    }
    if (text == "imperial-uk") {
        return Units::ImperialUk;
    }
    throw Error(ErrorKind::WrongUse, "units is metric, imperial or imperial-uk, not \"" + text + "\"");
}

} // namespace

NativeCar::NativeCar(CarOptions const& options)
    : m_car(interruptibly([options] { return std::make_shared<Car>(options); }))
{}

NativeCar::~NativeCar()
{
    close();
}

// Joins the car's thread, which may be waiting for Python's lock.
void NativeCar::close()
{
    std::shared_ptr<Car> car = std::move(m_car);
    py::gil_scoped_release const free;
    car.reset();
}

std::shared_ptr<Car> NativeCar::open() const
{
    if (m_car == nullptr) {
        throw Error(ErrorKind::WrongUse, "The car is closed");
    }
    return m_car;
}

py::list NativeCar::read(std::vector<std::string> const& sensors) const
{
    auto const readings = interruptibly([car = open(), sensors] { return car->read(sensors); });
    py::list list;
    for (Reading const& reading : readings) {
        list.append(plain(reading));
    }
    return list;
}

std::unique_ptr<NativeWatch> NativeCar::watch(std::vector<std::string> const& sensors, py::object const& callback) const
{
    auto const queue = std::make_shared<ReadingQueue>();
    Car::OnReading onReading = [queue](Reading const& reading) { queue->push(reading); };
    if (!callback.is_none()) {
        onReading = Callback(callback.cast<py::function>());
    }
    auto const onLink = [queue](LinkState state) { queue->setLink(state); };
    auto const car = open();
    Watch watch = interruptibly([car, sensors, onReading, onLink] { return car->watch(sensors, onReading, onLink); });
    return std::make_unique<NativeWatch>(car, queue, std::move(watch));
}

void NativeCar::reconnect() const
{
    runInterruptibly([car = open()] { car->reconnect(); });
}

std::string NativeCar::reportJson() const
{
    return interruptibly([car = open()] { return car->report().toJson(); });
}

std::unique_ptr<NativeCar> openCar(std::string const& port, py::dict const& given)
{
    CarOptions options;
    options.port = port;
    take(given, "baud", options.baud);
    take(given, "protocol", options.protocol);
    take(given, "reset", options.reset);
    take(given, "module", options.module);
    take(given, "sleep", options.sleep);
    if (given.contains("units") && !given["units"].is_none()) {
        options.units = toUnits(given["units"].cast<std::string>());
    }
    take(given, "log_file", options.logFile);
    take(given, "trace_file", options.traceFile);
    take(given, "settings_file", options.settingsFile);
    if (given.contains("progress") && !given["progress"].is_none()) {
        options.onProgress = Callback(given["progress"].cast<py::function>());
    }
    return std::make_unique<NativeCar>(options);
}

} // namespace velmora::python
