#pragma once

#include "libvelmora/read/modulereader.h"
#include "libvelmora/report/moduletopic.h"
#include "program/command/commandsession.h"
#include "program/exitcode.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <obd/iecu.h>
#include <velmora/error.h>
#include <velmora/print.h>

#include <fmt/format.h>

#include <algorithm>
#include <type_traits>

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

// Throws, if no module told anything: that the vehicle is silent, if one offers it, else what is given.
template <typename Report>
void requireAnswer(Session const& session, std::vector<ModuleTopic<Report>> const& modules, Error const& notOffered)
{
    auto const any = [&modules](auto const& holds) {
        return std::any_of(modules.begin(), modules.end(),
                           [&holds](ModuleTopic<Report> const& module) { return holds(module.report); });
    };
    if (any([](Report const& report) { return hasAnswer(report); })) {
        return;
    }
    if constexpr (HasTopicAnswer<Report>) {
        if (any([](Report const& report) { return report.answer == TopicAnswer::Silent; })) {
            throw silentVehicle(session, "The vehicle did not answer this",
                                {"is the ignition still on?",
                                 "some vehicles answer only with the engine running, or only with it off",
                                 "a control module that does not offer it may stay silent, too"});
        }
    }
    throw notOffered;
}

template <typename Read>
ExitCode showTopic(GlobalOptions const& options, Read const& read, Error const& notOffered)
{
    CommandSession session(options);
    session.connect();
    auto const modules = readModules(session, read);
    print(modules, options);
    requireAnswer(session, modules, notOffered);
    return ExitCode::Done;
}

} // namespace velmora::cli
