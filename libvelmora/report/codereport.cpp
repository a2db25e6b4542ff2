#include "libvelmora/report/codereport.h"

#include "libvelmora/report/texts/findingtexts.h"

#include <velmora/findings.h>

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

Json toJson(MakerChoice const& choice)
{
    static constexpr char const* words[] = {"", "option", "VIN", "guess"};
    if (choice.by == MakerChoice::By::Nothing) {
        return nullptr;
    }
    return {{"name", choice.maker}, {"by", words[static_cast<int>(choice.by)]}};
}

} // namespace

bool hasMakersCodes(CodeReport const& report)
{
    return std::any_of(report.lists.begin(), report.lists.end(), [](CodeList const& list) {
        return std::any_of(list.codes.begin(), list.codes.end(),
                           [](TroubleCode const& code) { return isMakersCode(code.code); });
    });
}

void applyMaker(CodeReport& report, MakerChoice const& maker)
{
    report.maker = maker;
    for (CodeList& list : report.lists) {
        for (TroubleCode& code : list.codes) {
            code.maker = maker.holding();
        }
    }
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

std::vector<std::string> untold(CodeReport const& report)
{
    std::vector<std::string> list;
    if (!report.lamp && report.lampAnswer != TopicAnswer::NotOffered) {
        list.emplace_back(texts::finding::lampTopic);
    }
    for (CodeList const& codes : report.lists) {
        if (codes.kind == CodeKind::Confirmed && codes.answer != CodeList::Answer::Read && codes.offered) {
            list.emplace_back(texts::finding::confirmedTopic);
        }
    }
    return list;
}

Json toJsonValue(CodeReport const& report)
{
    Json document = {{"lamp", valueOrNull(report.lamp)},
                     {"lampAnswer", answerWord(report.lamp ? TopicAnswer::Read : report.lampAnswer)},
                     {"maker", toJson(report.maker)}};
    for (CodeList const& list : report.lists) {
        bool const read = list.answer == CodeList::Answer::Read;
        document[kindKey(list.kind)] = {{"answer", answerKey(list.answer)},
                                        {"offered", list.offered},
                                        {"reason", textOrNull(list.reason)},
                                        {"codes", read ? toJsonValue(list.codes) : Json(nullptr)}};
    }
    return document;
}

} // namespace velmora
