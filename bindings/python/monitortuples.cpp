#include "bindings/python/tuples.h"

namespace py = pybind11;

namespace velmora::python {

namespace {

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

py::tuple plain(OnBoardMonitor const& monitor)
{
    py::list tests;
    for (LimitTest const& test : monitor.tests) {
        tests.append(py::make_tuple(test.id, text(test.description), text(test.value), textOrNone(test.minimum),
                                    textOrNone(test.maximum), text(test.unit), word(test.verdict)));
    }
    return py::make_tuple(monitor.id, text(monitor.description), tests);
}

} // namespace

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

py::tuple plain(MonitorsReport const& report)
{
    py::list monitors;
    for (OnBoardMonitor const& monitor : report.monitors) {
        monitors.append(plain(monitor));
    }
    return py::make_tuple(printed(report.answer), monitors);
}

py::tuple plain(CountersReport const& report)
{
    py::list counters;
    for (CountersReport::Counter const& counter : report.counters) {
        counters.append(py::make_tuple(text(counter.name), counter.value));
    }
    return py::make_tuple(printed(report.answer), counters);
}

} // namespace velmora::python
