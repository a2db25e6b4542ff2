#include "libvelmora/report/codereport.h"

#include "program/view/layout.h"

#include <algorithm>

namespace velmora {

namespace {

struct KindNames
{
    char const* title;
    char const* key;
};

KindNames const& names(CodeKind kind)
{
    static constexpr KindNames all[] = {{"Confirmed", "confirmed"}, {"Pending", "pending"}, {"Permanent", "permanent"}};
    return all[static_cast<int>(kind)];
}

char const* answerKey(CodeList::Answer answer)
{
    static constexpr char const* all[] = {"read", "refused", "no answer", "unreadable"};
    return all[static_cast<int>(answer)];
}

std::string summary(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Refused:
        return "refused: " + list.reason;
    case CodeList::Answer::Silent:
        return "no answer";
    case CodeList::Answer::Unreadable:
        return "the reply can't be read";
    case CodeList::Answer::Read:
        break;
    }
    if (list.codes.empty()) {
        return "none stored";
    }
    return counted(list.codes.size(), "code");
}

Mark mark(CodeList const& list)
{
    if (list.answer != CodeList::Answer::Read) {
        return Mark::Faint;
    }
    if (list.codes.empty()) {
        return Mark::Good;
    }
    return list.kind == CodeKind::Pending ? Mark::Warning : Mark::Bad;
}

} // namespace

std::string lampText(std::optional<bool> const& lamp, Style const& style)
{
    return !lamp ? "-" : *lamp ? style.paint(Mark::Bad, "on") : style.paint(Mark::Good, "off");
}

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

std::string toText(CodeReport const& report, Style const& style)
{
    std::string text = labelledLine("Lamp", lampText(report.lamp, style));
    for (CodeList const& list : report.lists) {
        text += labelledLine(names(list.kind).title, style.paint(mark(list), summary(list)));
        for (TroubleCode const& code : list.codes) {
            text += toText(code, "    ");
        }
    }
    return text;
}

Json toJsonValue(CodeReport const& report)
{
    Json document = {{"lamp", valueOrNull(report.lamp)}};
    for (CodeList const& list : report.lists) {
        bool const read = list.answer == CodeList::Answer::Read;
        document[names(list.kind).key] = {{"answer", answerKey(list.answer)},
                                          {"reason", textOrNull(list.reason)},
                                          {"codes", read ? toJsonValue(list.codes) : Json(nullptr)}};
    }
    return document;
}

} // namespace velmora
