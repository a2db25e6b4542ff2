#include "libvelmora/read/codeclearing.h"

#include "common/text/text.h"
#include "libvelmora/read/servicereplies.h"

#include <obd/iecumanager.h>

#include <fmt/format.h>

#include <algorithm>
#include <set>

namespace velmora {

namespace {

constexpr unsigned char clearService = 0x04;
// Some modules write their memory before they answer.
constexpr unsigned int clearLimitMs = 5000;

ClearReport toReport(ServiceReply const& reply)
{
    using Result = ClearReport::Result;
    static constexpr Result results[] = {Result::Cleared, Result::Refused, Result::NoAnswer, Result::Unreadable};
    return {results[static_cast<int>(reply.kind)], reply.reason};
}

std::set<unsigned int> knownModules(obd::IEcuManager& modules)
{
    std::vector<unsigned int> ids;
    modules.getEcuIds(ids);
    return {ids.begin(), ids.end()};
}

// What a refusal means for who wanted it.
Error refusedToClear(ModuleTopic<ClearReport> const& module)
{
    return {ErrorKind::Refused,
            fmt::format("Control module {:X} refused to clear its codes: {}", module.id, module.report.reason),
            {"most modules clear only with the ignition on and the engine off"}};
}

} // namespace

// The library's own clearing tells of the current module alone; asking again to learn of the others would clear twice.
std::vector<ModuleTopic<ClearReport>> clearCodes(Session& session)
{
    ServiceReplies const replies(*session.proxy(), clearService, clearLimitMs);
    session.checkAdapter();
    obd::IEcuManager& modules = *session.obd().getEcuManager();
    std::set<unsigned int> ids = knownModules(modules);
    for (unsigned int const id : replies.answering()) {
        ids.insert(id);
    }
    std::vector<ModuleTopic<ClearReport>> reports;
    for (unsigned int const id : ids) {
        reports.push_back({id, readable(modules.getEcuName(id)), toReport(replies.of(id))});
    }
    for (std::shared_ptr<obd::IEcu> const& ecu : modules.getEcus()) {
        if (replies.of(ecu->id()).kind == ServiceReply::Kind::Positive) {
            ecu->resetFreezeFrameConfiguration(); // the module has erased what the library knows of them
        }
    }
    return reports;
}

void requireCleared(std::vector<ModuleTopic<ClearReport>> const& modules)
{
    auto const first = [&modules](ClearReport::Result result) {
        return std::find_if(modules.begin(), modules.end(),
                            [result](auto const& module) { return module.report.result == result; });
    };
    if (first(ClearReport::Result::Cleared) != modules.end()) {
        return;
    }
    if (auto const refusing = first(ClearReport::Result::Refused); refusing != modules.end()) {
        throw refusedToClear(*refusing);
    }
    throw Error(ErrorKind::VehicleSilent, "No control module confirmed that it cleared its codes",
                {"is the ignition still on?", "read the codes to see what is stored now"});
}

void requireAllCleared(std::vector<ModuleTopic<ClearReport>> const& modules)
{
    for (ModuleTopic<ClearReport> const& module : modules) {
        if (module.report.result == ClearReport::Result::Refused) {
            throw refusedToClear(module);
        }
    }
    requireCleared(modules);
}

} // namespace velmora
