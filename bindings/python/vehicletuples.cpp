#include "bindings/python/threads.h"
#include "bindings/python/tuples.h"

namespace py = pybind11;

namespace velmora::python {

namespace {

py::object valueOf(Reading const& reading)
{
    if (auto const value = number(reading)) {
        return py::float_(*value);
    }
    return std::holds_alternative<std::string>(reading.value) ? py::object(text(std::get<std::string>(reading.value)))
                                                              : py::object(py::none());
}

} // namespace

py::str text(std::string const& bytes)
{
    return py::reinterpret_steal<py::str>(
        PyUnicode_DecodeUTF8(bytes.data(), static_cast<py::ssize_t>(bytes.size()), "replace"));
}

py::object textOrNone(std::string const& bytes)
{
    return bytes.empty() ? py::object(py::none()) : py::object(text(bytes));
}

py::tuple plain(Reading const& reading)
{
    double const seconds = std::chrono::duration<double>(reading.time.time_since_epoch()).count();
    return py::make_tuple(reading.sensor, valueOf(reading), text(reading.unit), text(reading.name), reading.module,
                          reading.pid, seconds, reading.precision,
                          py::bytes(reinterpret_cast<char const*>(reading.raw.data()), reading.raw.size()),
                          text(reading.vehicle));
}

py::tuple plain(InfoReport const& report)
{
    py::list calibrations;
    for (InfoReport::Calibration const& calibration : report.calibrations) {
        calibrations.append(py::make_tuple(text(calibration.id), textOrNone(calibration.verification)));
    }
    auto const reading = [](std::optional<InfoReport::Reading> const& told) {
        return told ? py::object(text(told->value + (told->unit.empty() ? "" : " " + told->unit)))
                    : py::object(py::none());
    };
    return py::make_tuple(textOrNone(report.vin), textOrNone(report.description), textOrNone(report.standard),
                          textOrNone(report.protocol), calibrations, textOrNone(report.engineSerialNumber),
                          textOrNone(report.erotan), reading(report.withLamp.distance),
                          reading(report.withLamp.runTime), reading(report.sinceCleared.distance),
                          reading(report.sinceCleared.runTime));
}

} // namespace velmora::python
