#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

namespace {

char const* title(CodeKind kind)
{
    static constexpr char const* all[] = {texts::confirmed, texts::pending, texts::permanent};
    return all[static_cast<int>(kind)];
}

std::string summary(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Refused:
        return fmt::format(texts::plain::refusedBecause, list.reason);
    case CodeList::Answer::Silent:
        return texts::noAnswer;
    case CodeList::Answer::Unreadable:
        return texts::cantBeRead;
    case CodeList::Answer::Read:
        break;
    }
    if (list.codes.empty()) {
        return texts::noneStored;
    }
    return counted(list.codes.size(), texts::plain::codeNoun);
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
        return fmt::format(texts::plain::listOf, choice.maker);
    case MakerChoice::By::Vin:
        return fmt::format(texts::plain::listByVin, choice.maker);
    case MakerChoice::By::Guess:
        return fmt::format(texts::plain::listByGuess, choice.maker);
    case MakerChoice::By::Nothing:
        break;
    }
    return texts::plain::noList;
}

} // namespace

std::string lampText(std::optional<bool> const& lamp, Style const& style)
{
    return !lamp ? "-" : *lamp ? style.paint(Mark::Bad, texts::on) : style.paint(Mark::Good, texts::off);
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
    std::string text = labelledLine(texts::lampShort, lampText(report.lamp, style));
    for (CodeList const& list : report.lists) {
        text += labelledLine(title(list.kind), style.paint(mark(list), summary(list)));
        for (TroubleCode const& code : list.codes) {
            text += toText(code, "    ", style.isDetailed());
        }
    }
    return text + (hasMakersCodes(report) ? labelledLine(texts::plain::meanings, makerText(report.maker)) : "");
}

} // namespace velmora
