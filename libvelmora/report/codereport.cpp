#include "libvelmora/report/codereport.h"

#include <algorithm>

namespace velmora {

namespace {

char const* kindKey(CodeKind kind)
{
    static constexpr char const* all[] = {"confirmed", "pending", "permanent"};
    return all[static_cast<int>(kind)];
}

char const* answerKey(CodeList::Answer answer)
{
    static constexpr char const* all[] = {"read", "refused", "no answer", "unreadable"};
    return all[static_cast<int>(answer)];
}

} // namespace

bool hasFindings(CodeReport const& report)
{
    return report.lamp.value_or(false) ||
           std::any_of(report.lists.begin(), report.lists.end(),
                       [](CodeList const& list) { return list.kind != CodeKind::Pending && !list.codes.empty(); });
}

bool hasAnswer(CodeReport const& report)
{
    return std::any_of(report.lists.begin(), report.lists.end(),
                       [](CodeList const& list) { return list.answer == CodeList::Answer::Read; });
}

bool canBeChecked(CodeReport const& report)
{
    return report.lamp || std::any_of(report.lists.begin(), report.lists.end(), [](CodeList const& list) {
               return list.kind == CodeKind::Confirmed && list.answer == CodeList::Answer::Read;
           });
}

Json toJsonValue(CodeReport const& report)
{
    Json document = {{"lamp", valueOrNull(report.lamp)}};
    for (CodeList const& list : report.lists) {
        bool const read = list.answer == CodeList::Answer::Read;
        document[kindKey(list.kind)] = {{"answer", answerKey(list.answer)},
                                        {"reason", textOrNull(list.reason)},
                                        {"codes", read ? toJsonValue(list.codes) : Json(nullptr)}};
    }
    return document;
}

} // namespace velmora
