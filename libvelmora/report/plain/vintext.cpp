#include "libvelmora/report/plain/vintext.h"

#include "common/text/layout.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"
#include "libvelmora/report/vinreport.h"

#include <fmt/format.h>

namespace velmora {

namespace {

std::string yearText(VinFacts const& facts)
{
    if (facts.years.empty()) {
        return fmt::format(texts::plain::noYear, facts.vin[9]);
    }
    std::string const years = fmt::format("{}", fmt::join(facts.years, texts::orYear));
    if (facts.yearBasis == VinFacts::YearBasis::Position) {
        return fmt::format(texts::plain::yearByPosition, years, facts.vin[9]);
    }
    return fmt::format(texts::plain::yearPerhaps, years, facts.vin[9]);
}

std::string checkText(VinFacts const& facts, Style const& style)
{
    switch (facts.checkDigit) {
    case VinFacts::CheckDigit::Right:
        return style.paint(Mark::Good, texts::plain::checkRight);
    case VinFacts::CheckDigit::Wrong:
        return style.paint(Mark::Bad, fmt::format(texts::plain::checkWrong, facts.computedCheck));
    case VinFacts::CheckDigit::NotJudged:
        break;
    }
    return texts::plain::checkUnused;
}

std::string codesText(VinFacts const& facts)
{
    switch (facts.basis) {
    case VinFacts::CodesBasis::Fact:
        return fmt::format(texts::plain::codesByDefault, facts.codes);
    case VinFacts::CodesBasis::Guess:
        return fmt::format(texts::plain::codesPerhaps, facts.codes);
    case VinFacts::CodesBasis::None:
        break;
    }
    return facts.maker.empty() ? "" : texts::plain::codesUnknown;
}

} // namespace

std::string toText(VinFacts const& facts, Style const& style)
{
    return labelledLine(texts::vin, facts.vin) + labelledLine(texts::plain::region, facts.region) +
           labelledLine(texts::plain::country, facts.country) + labelledLine(texts::maker, makerText(facts)) +
           labelledLine(texts::modelYear, yearText(facts)) +
           labelledLine(texts::plain::checkDigit, checkText(facts, style)) +
           labelledLine(texts::codes, codesText(facts));
}

} // namespace velmora
