#include "libvelmora/report/clearreport.h"
#include "libvelmora/report/codereport.h"
#include "libvelmora/report/limittest.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"
#include "libvelmora/report/routinesreport.h"

#include <velmora/actions.h>
#include <velmora/report.h>

#include <fmt/format.h>

#include <ostream>

namespace velmora {

namespace {

// Puts the lines of a report together: none behind the last one.
class Lines
{
public:
    explicit Lines(std::ostream& out) : m_out(out) {}

    std::ostream& next()
    {
        m_out << (m_first ? "" : "\n");
        m_first = false;
        return m_out;
    }

    void text(char const* label, std::string const& value)
    {
        if (!value.empty()) {
            next() << label << ": " << value;
        }
    }

private:
    std::ostream& m_out;
    bool m_first = true;
};

char const* answerOf(CodeList const& list)
{
    static constexpr char const* words[] = {"none stored", "refused", "no answer", "unreadable"};
    return words[static_cast<int>(list.answer)];
}

std::ostream& withReason(std::ostream& out, std::string const& reason)
{
    return reason.empty() ? out : out << ": " << reason;
}

std::string readingText(InfoReport::Reading const& reading)
{
    return reading.unit.empty() ? reading.value : reading.value + " " + reading.unit;
}

} // namespace

std::ostream& operator<<(std::ostream& out, CodeKind kind)
{
    static constexpr char const* words[] = {"confirmed", "pending", "permanent"};
    return out << words[static_cast<int>(kind)];
}

std::ostream& operator<<(std::ostream& out, TroubleCode const& code)
{
    return out << code.code << ' ' << meaningText(code);
}

std::ostream& operator<<(std::ostream& out, StoredCode const& code)
{
    return out << fmt::format("{:X} ", code.module) << code.kind << ' ' << code.code;
}

std::ostream& operator<<(std::ostream& out, TopicAnswer answer)
{
    return out << answerWord(answer);
}

std::ostream& operator<<(std::ostream& out, LimitTest const& test)
{
    char const* const verdict = verdictWord(test.verdict);
    out << (*verdict == '\0' ? "constant" : verdict) << ": " << test.description << ' ' << test.value;
    if (!test.minimum.empty() || !test.maximum.empty()) {
        out << " (" << (test.minimum.empty() ? "-" : test.minimum) << " to "
            << (test.maximum.empty() ? "-" : test.maximum) << ')';
    }
    return test.unit.empty() ? out : out << ' ' << test.unit;
}

std::ostream& operator<<(std::ostream& out, FreezeFrame const& frame)
{
    out << frame.code;
    for (FreezeFrame::Reading const& reading : frame.readings) {
        out << '\n' << reading.name << ": " << reading.value.value_or("-");
        if (reading.value && !reading.unit.empty()) {
            out << ' ' << reading.unit;
        }
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, FreezeReport const& report)
{
    if (report.frame) {
        return out << *report.frame;
    }
    return out << "frame " << report.number << ": "
               << (report.answer == TopicAnswer::Read ? "none stored" : answerWord(report.answer));
}

std::ostream& operator<<(std::ostream& out, ReadinessMonitor const& monitor)
{
    return out << monitor.name << ": " << statusWord(monitor.sinceCleared);
}

std::ostream& operator<<(std::ostream& out, ReadinessReport const& report)
{
    if (report.monitors.empty()) {
        return out << report.answer;
    }
    Lines lines(out);
    for (ReadinessMonitor const& monitor : report.monitors) {
        lines.next() << monitor;
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, MonitorsReport const& report)
{
    if (report.monitors.empty()) {
        return out << report.answer;
    }
    Lines lines(out);
    for (OnBoardMonitor const& monitor : report.monitors) {
        for (LimitTest const& test : monitor.tests) {
            lines.next() << monitor.description << ": " << test;
        }
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, CountersReport const& report)
{
    if (report.counters.empty()) {
        return out << report.answer;
    }
    Lines lines(out);
    for (CountersReport::Counter const& counter : report.counters) {
        lines.next() << counter.name << ": " << counter.value;
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, OxygenReport const& report)
{
    if (report.sensors.empty()) {
        return out << report.answer;
    }
    Lines lines(out);
    for (OxygenSensor const& sensor : report.sensors) {
        lines.next() << locationName(sensor.location);
        for (LimitTest const& test : sensor.tests) {
            lines.next() << locationName(sensor.location) << ": " << test;
        }
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, Routine const& routine)
{
    return out << routineId(routine.id) << ' ' << routine.name;
}

std::ostream& operator<<(std::ostream& out, RoutinesReport const& report)
{
    if (report.routines.empty()) {
        return out << report.answer;
    }
    Lines lines(out);
    for (Routine const& routine : report.routines) {
        lines.next() << routine;
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, RoutineRun const& run)
{
    return withReason(out << run.routine << ": " << resultWord(run.result), run.reason);
}

std::ostream& operator<<(std::ostream& out, ClearReport const& report)
{
    return withReason(out << resultWord(report.result), report.reason);
}

std::ostream& operator<<(std::ostream& out, InfoReport const& report)
{
    Lines lines(out);
    lines.text("Description", report.description);
    lines.text("Standard", report.standard);
    lines.text("Protocol", report.protocol);
    lines.text("VIN", report.vin);
    for (InfoReport::Calibration const& calibration : report.calibrations) {
        lines.next() << "Calibration: " << calibration.id << ' ' << calibration.verification;
    }
    lines.text("Engine number", report.engineSerialNumber);
    lines.text("Type approval", report.erotan);
    if (report.sinceCleared.distance) {
        lines.text("Distance since cleared", readingText(*report.sinceCleared.distance));
    }
    return out;
}

std::ostream& operator<<(std::ostream& out, CodeReport const& report)
{
    out << "Lamp: " << (!report.lamp ? "-" : *report.lamp ? "on" : "off");
    for (CodeList const& list : report.lists) {
        if (list.codes.empty()) {
            out << '\n' << list.kind << ": " << answerOf(list);
        }
        for (TroubleCode const& code : list.codes) {
            out << '\n' << list.kind << ": " << code;
        }
    }
    return out;
}

std::ostream& writeModule(std::ostream& out, unsigned int id, std::string const& name)
{
    return out << fmt::format("{:X} {}\n", id, name);
}

std::ostream& operator<<(std::ostream& out, VehicleReport const& report)
{
    out << report.adapter.device << ", " << report.protocol.name;
    for (ModuleReport const& module : report.modules) {
        writeModule(out << '\n', module.id, module.name) << module.codes;
    }
    return out;
}

} // namespace velmora
