#include "program/view/layout.h"
#include "program/view/reporttext.h"

#include <fmt/format.h>

namespace velmora::cli {

namespace {

char const* title(CodeKind kind)
{
    static constexpr char const* all[] = {"Confirmed", "Pending", "Permanent"};
    return all[static_cast<int>(kind)];
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

std::string makerText(MakerChoice const& choice)
{
    switch (choice.by) {
    case MakerChoice::By::Option:
        return choice.maker + "'s";
    case MakerChoice::By::Vin:
        return choice.maker + "'s, by the VIN";
    case MakerChoice::By::Guess:
        return fmt::format("not known; perhaps {0}'s: --make \"{0}\"", choice.maker);
    case MakerChoice::By::Nothing:
        break;
    }
    return "not known; --make MAKER names the maker, -v lists all";
}

} // namespace

std::string lampText(std::optional<bool> const& lamp, Style const& style)
{
    return !lamp ? "-" : *lamp ? style.paint(Mark::Bad, "on") : style.paint(Mark::Good, "off");
}

std::string toText(TroubleCode const& code, std::string const& indent, bool all)
{
    auto const line = [&](std::string const& lead, std::string const& maker, std::string const& text) {
        return fmt::format("{}{:<5}  {:<13}  {}\n", indent, lead, maker, text);
    };
    if (!all) {
        TroubleCode::Meaning const* const holds = meaningOf(code);
        return line(code.code, holds != nullptr ? holds->maker : "-", meaningText(code));
    }
    std::string text;
    for (TroubleCode::Meaning const& meaning : code.meanings) {
        text += line(text.empty() ? code.code : "", meaning.maker, meaning.text);
    }
    return text;
}

std::string toText(CodeReport const& report, Style const& style)
{
    std::string text = labelledLine("Lamp", lampText(report.lamp, style));
    for (CodeList const& list : report.lists) {
        text += labelledLine(title(list.kind), style.paint(mark(list), summary(list)));
        for (TroubleCode const& code : list.codes) {
            text += toText(code, "    ", style.isDetailed());
        }
    }
    return text + (hasMakersCodes(report) ? labelledLine("Meanings", makerText(report.maker)) : "");
}

} // namespace velmora::cli
