#pragma once

#include <velmora/actions.h>
#include <velmora/topics.h>

#include <pybind11/pybind11.h>
#include <pybind11/stl.h>

#include <sstream>
#include <string>
#include <vector>

// Plain tuples, of which the Python part makes its objects: in the order of the fields there.

namespace velmora::python {

// A vehicle may say any bytes: those that are no UTF-8 are replaced.
pybind11::str text(std::string const& bytes);
pybind11::object textOrNone(std::string const& bytes);

template <typename Value>
std::string printed(Value const& value)
{
    std::ostringstream out;
    out << value;
    return out.str();
}

pybind11::tuple plain(TroubleCode const& code);
pybind11::tuple plain(CodeReport const& report);
pybind11::tuple plain(FreezeReport const& report);
pybind11::tuple plain(ClearReport const& report);
pybind11::tuple plain(ReadinessReport const& report);
pybind11::tuple plain(MonitorsReport const& report);
pybind11::tuple plain(CountersReport const& report);
pybind11::tuple plain(InfoReport const& report);

// Each control module with its report.
template <typename Report>
pybind11::list plainModules(std::vector<ModuleTopic<Report>> const& modules)
{
    pybind11::list list;
    for (ModuleTopic<Report> const& module : modules) {
        list.append(pybind11::make_tuple(module.id, text(module.name), plain(module.report)));
    }
    return list;
}

} // namespace velmora::python
