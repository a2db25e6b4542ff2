#include "program/view/performancetext.h"

#include "common/text/text.h"
#include "program/view/live/bigdigits.h"
#include "program/view/unitpairs.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>

namespace velmora::cli {

namespace {

double shownAs(double value, std::string const& metric, std::string const& imperial, PerformanceView const& view)
{
    return view.imperial ? converted(value, metric, imperial).value_or(value) : value;
}

std::string goalLine(SprintGoal const& goal, PerformanceView const& view)
{
    std::optional<SprintTime> const time = timeOf(goal, view.run.speeds, view.run.interval);
    if (!time) {
        return fmt::format("  {:<16} {:>8}", goal.name, "-");
    }
    std::string const end = goal.toKmh ? std::string()
                                       : fmt::format("  at {:.0f} {}", shownAs(time->endKmh, "km/h", "mph", view),
                                                     view.imperial ? "mph" : "km/h");
    return fmt::format("  {:<16} {:>6.2f} s +- {:.2f} s{}", goal.name, time->seconds, time->errorSeconds, end);
}

std::string curveLine(PowerPoint const& point, double highest, PerformanceView const& view, FrameStyle const& style)
{
    std::string const head =
        fmt::format("  {:>5.0f} rpm {:>5.0f} {} {:>5.0f} Nm ", point.rpm, shownAs(point.kilowatt, "kW", "hp", view),
                    view.imperial ? "hp" : "kW", point.newtonMetre);
    std::size_t const room = style.columns > head.size() ? style.columns - head.size() : 0;
    auto const length = static_cast<std::size_t>(std::lround(point.kilowatt / highest * static_cast<double>(room)));
    std::string bar;
    for (std::size_t i = 0; i < length; ++i) {
        bar += style.ascii ? "=" : "━";
    }
    return head + bar;
}

// As many steps as there is room for, those at the highest engine speeds last.
std::vector<std::string> curveLines(PerformanceView const& view, std::size_t room, FrameStyle const& style)
{
    std::vector<PowerPoint> const& points = view.run.powers;
    std::vector<std::string> lines;
    if (points.empty()) {
        return lines;
    }
    double const highest = std::ranges::max_element(points, {}, &PowerPoint::kilowatt)->kilowatt;
    for (std::size_t i = points.size() > room ? points.size() - room : 0; i < points.size(); ++i) {
        lines.push_back(curveLine(points[i], highest, view, style));
    }
    return lines;
}

} // namespace

std::string drawPerformance(PerformanceView const& view, FrameStyle const& style)
{
    std::vector<std::string> lines = {"Performance: " + stateText(view.run.state)};
    std::string const speed = fmt::format("{:.0f}", shownAs(view.run.kmh, "km/h", "mph", view));
    std::vector<std::string> const digits = bigText(speed, style.ascii);
    lines.insert(lines.end(), digits.begin(), digits.end());
    lines.back() += view.imperial ? " mph" : " km/h";
    lines.emplace_back();
    for (SprintGoal const& goal : sprintGoals(view.imperial)) {
        lines.push_back(goalLine(goal, view));
    }
    lines.emplace_back("  The start is reckoned back from the first readings that rise.");
    double const interval = view.run.interval;
    lines.push_back("  Speed comes in whole km/h" +
                    (interval > 0.0 ? fmt::format(" each {:.0f} ms.", interval * 1000.0) : std::string(".")));
    lines.emplace_back();
    lines.push_back(
        fmt::format("Highest power and torque by engine speed, for {} kg (settings weight)", view.run.kilograms));
    std::size_t const used = lines.size() + 2;
    std::vector<std::string> const curve = curveLines(view, style.rows > used ? style.rows - used : 0, style);
    lines.insert(lines.end(), curve.begin(), curve.end());
    lines.emplace_back();
    lines.push_back(view.note.empty() ? "p back to the values  e export the run  q quit" : view.note);
    std::string text;
    for (std::size_t i = 0; i < lines.size(); ++i) {
        text += looking(i == 0 ? Look::Heading : Look::Plain, cutTo(lines[i], style.columns), style) + "\n";
    }
    return text;
}

} // namespace velmora::cli
