#include "libvelmora/watch/codelooker.h"

#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"

#include <obd/iecumanager.h>

#include <algorithm>

namespace velmora {

namespace {

struct KindWord
{
    CodeKind kind;
    char const* word;
};
constexpr KindWord kindWords[] = {
    {CodeKind::Confirmed, "confirmed"}, {CodeKind::Pending, "pending"}, {CodeKind::Permanent, "permanent"}};

CodeLook toLook(unsigned int module, CodeReport const& report)
{
    CodeLook look;
    look.module = module;
    look.lamp = report.lamp;
    for (CodeList const& list : report.lists) {
        auto const* const word = std::ranges::find(kindWords, list.kind, &KindWord::kind);
        auto& codes = look.lists[word->word];
        if (list.answer != CodeList::Answer::Read) {
            continue;
        }
        codes.emplace();
        for (TroubleCode const& each : list.codes) {
            codes->push_back({each.code, meaningText(each)});
        }
    }
    return look;
}

} // namespace

std::vector<CodeLook> lookAtCodes(Session& session)
{
    CodeReader reader(session);
    std::vector<CodeLook> looks;
    unsigned int const current = session.obd().getEcuManager()->getCurrentEcu()->id();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        CodeLook look =
            toLook(ecu->id(), reader.read(*ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent}));
        ReadinessReport const readiness = readReadiness(session, *ecu);
        if (hasAnswer(readiness)) {
            look.notReady = static_cast<int>(countNotComplete(readiness));
        }
        looks.push_back(std::move(look));
    }
    session.obd().getEcuManager()->setCurrentEcu(current);
    return looks;
}

} // namespace velmora
