#pragma once

#include "common/text/style.h"
#include "libvelmora/report/finding/findings.h"
#include "libvelmora/report/finding/inspection.h"
#include "libvelmora/report/moduletopic.h"
#include "libvelmora/report/routinesreport.h"
#include "libvelmora/report/vehiclereport.h"

#include <velmora/print.h>

#include <optional>
#include <string>
#include <vector>

// Reports as text for people: for each topic indented lines under the heading of a control module.

namespace velmora {

// "Control module 7E8: ECM"
std::string moduleHeading(unsigned int id, std::string const& name);

// "on", "off" or "-".
std::string lampText(std::optional<bool> const& lamp, Style const& style);

// Code, maker and text in columns behind the indent: the meaning that holds, or a line for each that there is.
std::string toText(TroubleCode const& code, std::string const& indent, bool all);

std::string toText(CodeReport const& report, Style const& style);
std::string toText(CountersReport const& report, Style const& style);
std::string toText(FreezeReport const& report, Style const& style);
std::string toText(InfoReport const& report, Style const& style);
// A summary, then the tests by monitor; monitors with failed tests first, and in each the failed tests first.
std::string toText(MonitorsReport const& report, Style const& style);
// The sensors with their places, and below each its tests, the failed first.
std::string toText(OxygenReport const& report, Style const& style);
// A verdict, then the monitors: what is not complete first, what the vehicle does not have last.
std::string toText(ReadinessReport const& report, Style const& style);
std::string toText(RoutinesReport const& report, Style const& style);
std::string toText(RoutineRun const& run, Style const& style);

// The findings under a heading, or that there are none; below them what the data suggests, with reasons and doubts.
std::string toText(std::vector<Finding> const& findings, Style const& style);

std::string toText(InspectionReport const& report, Style const& style);

// Headings and aligned columns: adapter and protocol, what is wrong with the whole vehicle, then all that each module
// told. The inspection stands behind the findings, where there is one.
std::string toText(VehicleReport const& report, Style const& style,
                   std::optional<InspectionReport> const& inspection = std::nullopt);

// The style that the companion's callers ask for.
Style styleOf(TextStyle const& style);

template <typename Report>
std::string toText(std::vector<ModuleTopic<Report>> const& modules, Style const& style)
{
    std::string text;
    for (ModuleTopic<Report> const& module : modules) {
        text +=
            (text.empty() ? "" : "\n") + moduleHeading(module.id, module.name) + "\n" + toText(module.report, style);
    }
    return text;
}

} // namespace velmora
