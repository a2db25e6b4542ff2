#pragma once

#include "program/command/commandcar.h"
#include "program/exitcode.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/error.h>
#include <velmora/print.h>

#include <fmt/format.h>

#include <algorithm>
#include <functional>
#include <vector>

// The common shape of the commands that show one topic of every control module.

namespace velmora::cli {

template <typename Report>
void print(std::vector<ModuleTopic<Report>> const& modules, GlobalOptions const& options)
{
    if (options.json) {
        fmt::print("{}", toJson(modules));
    } else {
        printText(toText(modules, textStyle(options)));
    }
    flushOutput();
}

// Whether a module told anything of a topic.
template <typename Report>
bool hasTold(Report const& report)
{
    return report.answer == TopicAnswer::Read;
}

inline bool hasTold(CodeReport const& report)
{
    return std::any_of(report.lists.begin(), report.lists.end(),
                       [](CodeList const& list) { return list.answer == CodeList::Answer::Read; });
}

template <typename Report>
bool isSilent(Report const& report)
{
    return report.answer == TopicAnswer::Silent;
}

inline bool isSilent(CodeReport const& /*report*/)
{
    return false; // its lists tell that one by one
}

// Throws, if no module told anything: that the vehicle is silent, if one offers it, else what is given.
template <typename Report>
void requireAnswer(Car& car, std::vector<ModuleTopic<Report>> const& modules, Error const& notOffered)
{
    auto const any = [&modules](auto const& holds) {
        return std::any_of(modules.begin(), modules.end(),
                           [&holds](ModuleTopic<Report> const& module) { return holds(module.report); });
    };
    if (any([](Report const& report) { return hasTold(report); })) {
        return;
    }
    if (any([](Report const& report) { return isSilent(report); })) {
        throw silentVehicle(car, "The vehicle did not answer this",
                            {"is the ignition still on?",
                             "some vehicles answer only with the engine running, or only with it off",
                             "a control module that does not offer it may stay silent, too"});
    }
    throw notOffered;
}

// read: a function of Car that gives a topic.
template <typename Read>
ExitCode showTopic(GlobalOptions const& options, Read const& read, Error const& notOffered)
{
    CommandCar car(options);
    auto const modules = std::invoke(read, static_cast<Car&>(car));
    print(modules, options);
    requireAnswer(car, modules, notOffered);
    return ExitCode::Done;
}

} // namespace velmora::cli
