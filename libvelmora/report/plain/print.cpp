#include "libvelmora/report/clearreport.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/plain/vintext.h"
#include "libvelmora/report/vinreport.h"

#include <velmora/print.h>

namespace velmora {

Style styleOf(TextStyle const& style)
{
    return Style(style.coloured, style.detailed, style.columns);
}

std::string toText(std::vector<ModuleTopic<CodeReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<CountersReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<FreezeReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<InfoReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<MonitorsReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<OxygenReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<ReadinessReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(std::vector<ModuleTopic<RoutinesReport>> const& modules, TextStyle const& style)
{
    return toText(modules, styleOf(style));
}

std::string toText(ModuleTopic<RoutineRun> const& run, TextStyle const& style)
{
    return moduleHeading(run.id, run.name) + "\n" + toText(run.report, styleOf(style));
}

std::string toText(TroubleCode const& code)
{
    return toText(code, {}, true);
}

std::string toText(VinFacts const& facts, TextStyle const& style)
{
    return toText(facts, styleOf(style));
}

std::string toJson(std::vector<ModuleTopic<ClearReport>> const& modules)
{
    return toJson<ClearReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<CodeReport>> const& modules)
{
    return toJson<CodeReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<CountersReport>> const& modules)
{
    return toJson<CountersReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<FreezeReport>> const& modules)
{
    return toJson<FreezeReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<InfoReport>> const& modules)
{
    return toJson<InfoReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<MonitorsReport>> const& modules)
{
    return toJson<MonitorsReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<OxygenReport>> const& modules)
{
    return toJson<OxygenReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<ReadinessReport>> const& modules)
{
    return toJson<ReadinessReport>(modules);
}

std::string toJson(std::vector<ModuleTopic<RoutinesReport>> const& modules)
{
    return toJson<RoutinesReport>(modules);
}

std::string toJson(ModuleTopic<RoutineRun> const& run)
{
    return toJson<RoutineRun>({run});
}

std::string toJson(std::vector<TroubleCode> const& codes)
{
    return printed(toJsonValue(codes));
}

std::string toJson(VinFacts const& facts)
{
    return printed(toJsonValue(facts));
}

} // namespace velmora
