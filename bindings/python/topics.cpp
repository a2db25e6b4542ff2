#include "bindings/python/nativecar.h"
#include "bindings/python/threads.h"

#include <velmora/catalogue.h>

#include <pybind11/stl.h>

#include <sstream>

namespace py = pybind11;

// Plain tuples, of which the Python part makes its objects: in the order of the fields there.

namespace velmora::python {

namespace {

// A vehicle may say any bytes: those that are no UTF-8 are replaced.
py::str text(std::string const& bytes)
{
    return py::reinterpret_steal<py::str>(
        PyUnicode_DecodeUTF8(bytes.data(), static_cast<py::ssize_t>(bytes.size()), "replace"));
}

py::object textOrNone(std::string const& bytes)
{
    return bytes.empty() ? py::object(py::none()) : py::object(text(bytes));
}

template <typename Value>
std::string printed(Value const& value)
{
    std::ostringstream out;
    out << value;
    return out.str();
}

char const* word(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Read:
        return "read";
    case CodeList::Answer::Refused:
        return list.offered ? "refused" : "not supported";
    case CodeList::Answer::Silent:
        return "no answer";
    case CodeList::Answer::Unreadable:
        break;
    }
    return "unreadable";
}

char const* word(ReadinessStatus status)
{
    switch (status) {
    case ReadinessStatus::Complete:
        return "complete";
    case ReadinessStatus::NotComplete:
        return "not complete";
    case ReadinessStatus::DisabledThisCycle:
        return "disabled";
    case ReadinessStatus::NotAvailable:
        break;
    }
    return "not available";
}

char const* word(LimitTest::Verdict verdict)
{
    switch (verdict) {
    case LimitTest::Verdict::Failed:
        return "failed";
    case LimitTest::Verdict::Passed:
        return "passed";
    case LimitTest::Verdict::NoResult:
        return "no result";
    case LimitTest::Verdict::None:
        break;
    }
    return "no limits";
}

py::list meaningsOf(TroubleCode const& code)
{
    py::list meanings;
    for (TroubleCode::Meaning const& meaning : code.meanings) {
        meanings.append(py::make_tuple(text(meaning.maker), text(meaning.text)));
    }
    return meanings;
}

py::tuple plain(TroubleCode const& code)
{
    return py::make_tuple(code.code, code.system, meaningsOf(code), textOrNone(code.maker),
                          text(printed(code).substr(code.code.size() + 1)));
}

py::tuple plain(CodeReport const& report)
{
    py::list lists;
    for (CodeList const& list : report.lists) {
        py::list codes;
        for (TroubleCode const& code : list.codes) {
            codes.append(plain(code));
        }
        lists.append(py::make_tuple(printed(list.kind), word(list), textOrNone(list.reason), codes));
    }
    return py::make_tuple(report.lamp, lists);
}

py::tuple plain(FreezeReport const& report)
{
    py::list readings;
    py::object code = py::none();
    if (report.frame) {
        code = plain(report.frame->code);
        for (FreezeFrame::Reading const& reading : report.frame->readings) {
            readings.append(py::make_tuple(
                text(reading.name), reading.value ? py::object(text(*reading.value)) : py::none(), text(reading.unit)));
        }
    }
    return py::make_tuple(printed(report.answer), report.number, code, readings);
}

py::tuple plain(ReadinessReport const& report)
{
    py::list monitors;
    for (ReadinessMonitor const& monitor : report.monitors) {
        monitors.append(
            py::make_tuple(text(monitor.name), word(monitor.sinceCleared),
                           monitor.thisCycle ? py::object(py::str(word(*monitor.thisCycle))) : py::object(py::none())));
    }
    return py::make_tuple(printed(report.answer), report.lamp, monitors);
}

py::tuple plain(OnBoardMonitor const& monitor)
{
    py::list tests;
    for (LimitTest const& test : monitor.tests) {
        tests.append(py::make_tuple(test.id, text(test.description), text(test.value), textOrNone(test.minimum),
                                    textOrNone(test.maximum), text(test.unit), word(test.verdict)));
    }
    return py::make_tuple(monitor.id, text(monitor.description), tests);
}

py::tuple plain(MonitorsReport const& report)
{
    py::list monitors;
    for (OnBoardMonitor const& monitor : report.monitors) {
        monitors.append(plain(monitor));
    }
    return py::make_tuple(printed(report.answer), monitors);
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

py::tuple plain(CountersReport const& report)
{
    py::list counters;
    for (CountersReport::Counter const& counter : report.counters) {
        counters.append(py::make_tuple(text(counter.name), counter.value));
    }
    return py::make_tuple(printed(report.answer), counters);
}

char const* word(ClearReport::Result result)
{
    switch (result) {
    case ClearReport::Result::Cleared:
        return "cleared";
    case ClearReport::Result::Refused:
        return "refused";
    case ClearReport::Result::NoAnswer:
        return "no answer";
    case ClearReport::Result::Unreadable:
        break;
    }
    return "unreadable";
}

py::tuple plain(ClearReport const& report)
{
    return py::make_tuple(word(report.result), textOrNone(report.reason));
}

// Each control module with its report.
template <typename Report>
py::list plainModules(std::vector<ModuleTopic<Report>> const& modules)
{
    py::list list;
    for (ModuleTopic<Report> const& module : modules) {
        list.append(py::make_tuple(module.id, text(module.name), plain(module.report)));
    }
    return list;
}

py::object valueOf(Reading const& reading)
{
    if (auto const value = number(reading)) {
        return py::float_(*value);
    }
    return std::holds_alternative<std::string>(reading.value) ? py::object(text(std::get<std::string>(reading.value)))
                                                              : py::object(py::none());
}

} // namespace

py::tuple plain(Reading const& reading)
{
    double const seconds = std::chrono::duration<double>(reading.time.time_since_epoch()).count();
    return py::make_tuple(reading.sensor, valueOf(reading), text(reading.unit), text(reading.name), reading.module,
                          reading.pid, seconds, reading.precision,
                          py::bytes(reinterpret_cast<char const*>(reading.raw.data()), reading.raw.size()),
                          text(reading.vehicle));
}

py::list NativeCar::modules() const
{
    py::list list;
    for (Module const& module : interruptibly([car = open()] { return car->modules(); })) {
        list.append(py::make_tuple(module.id, text(module.name), text(module.description)));
    }
    return list;
}

py::list NativeCar::sensors() const
{
    py::list list;
    for (Sensor const& sensor : interruptibly([car = open()] { return car->sensors(); })) {
        list.append(py::make_tuple(sensor.module, sensor.key, textOrNone(sensor.pid), text(sensor.title)));
    }
    return list;
}

py::list NativeCar::codes() const
{
    return plainModules(interruptibly([car = open()] { return car->codeReports(); }));
}

py::list NativeCar::freezeFrame(unsigned char frame) const
{
    return plainModules(interruptibly([car = open(), frame] { return car->freezeFrame(frame); }));
}

py::list NativeCar::readiness() const
{
    return plainModules(interruptibly([car = open()] { return car->readiness(); }));
}

py::list NativeCar::monitors() const
{
    return plainModules(interruptibly([car = open()] { return car->monitors(); }));
}

py::list NativeCar::info() const
{
    return plainModules(interruptibly([car = open()] { return car->info(); }));
}

py::list NativeCar::counters() const
{
    return plainModules(interruptibly([car = open()] { return car->counters(); }));
}

py::list NativeCar::clear() const
{
    return plainModules(interruptibly([car = open()] { return car->clearCodes(); }));
}

py::tuple explainCode(std::string const& code)
{
    return plain(explain(code));
}

} // namespace velmora::python
