#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <string>
#include <vector>

// Reports of made-up cars.

namespace testsupport {

inline velmora::TroubleCode troubleCode(std::string const& code)
{
    return {code, "Powertrain", {{"Generic", "Meaning of " + code}}};
}

inline velmora::CodeList readCodes(velmora::CodeKind kind, std::vector<std::string> const& codes)
{
    velmora::CodeList list{kind, velmora::CodeList::Answer::Read, {}, {}};
    for (std::string const& code : codes) {
        list.codes.push_back(troubleCode(code));
    }
    return list;
}

// A module in which nothing is wrong.
inline velmora::ModuleReport soundModule(unsigned int id = 0x7E8)
{
    using namespace velmora;
    ModuleReport module{id, "ECM", {0x0C}, {}, {}, {}, {}, {}, {}, {}};
    module.codes = {
        false,
        {readCodes(CodeKind::Confirmed, {}), readCodes(CodeKind::Pending, {}), readCodes(CodeKind::Permanent, {})}};
    module.readiness = {TopicAnswer::Read,
                        false,
                        {{"Misfire", ReadinessStatus::Complete, {}},
                         {"Catalyst", ReadinessStatus::Complete, {}},
                         {"Evaporative System", ReadinessStatus::Complete, {}},
                         {"Oxygen Sensor", ReadinessStatus::Complete, {}}}};
    return module;
}

inline velmora::VehicleReport vehicleOf(std::vector<velmora::ModuleReport> modules)
{
    return {{"ELM327 v1.5", "", "", 13.8F}, {6, "ISO 15765-4"}, std::move(modules)};
}

inline void setValue(velmora::ModuleReport& module, unsigned int pid, std::vector<double> samples,
                     std::string text = {}, std::string unit = {})
{
    std::string const shown = !text.empty() || samples.empty() ? text : std::to_string(int(samples.back()));
    module.values.push_back({pid, 0, "PID " + std::to_string(pid), shown, std::move(unit), std::move(samples)});
}

inline void setIncomplete(velmora::ModuleReport& module, std::string const& monitor)
{
    for (velmora::ReadinessMonitor& each : module.readiness.monitors) {
        if (each.name == monitor) {
            each.sinceCleared = velmora::ReadinessStatus::NotComplete;
        }
    }
}

} // namespace testsupport
