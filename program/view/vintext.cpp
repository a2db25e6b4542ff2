#include "program/view/vintext.h"

#include "libvelmora/report/vinreport.h"
#include "program/view/layout.h"

#include <fmt/format.h>

namespace velmora::cli {

namespace {

std::string yearText(VinFacts const& facts)
{
    if (facts.years.empty()) {
        return fmt::format("none coded in position 10 ({})", facts.vin[9]);
    }
    std::string const years = fmt::format("{}", fmt::join(facts.years, " or "));
    if (facts.yearBasis == VinFacts::YearBasis::Position) {
        return fmt::format("{} (position 10 is {}, position 7 says which cycle of 30 years)", years, facts.vin[9]);
    }
    return fmt::format("{}, if this maker codes it (position 10 is {})", years, facts.vin[9]);
}

std::string checkText(VinFacts const& facts, Style const& style)
{
    switch (facts.checkDigit) {
    case VinFacts::CheckDigit::Right:
        return style.paint(Mark::Good, "right");
    case VinFacts::CheckDigit::Wrong:
        return style.paint(Mark::Bad, fmt::format("wrong: {} would fit; mistyped or altered", facts.computedCheck));
    case VinFacts::CheckDigit::NotJudged:
        break;
    }
    return "not used by this maker or market";
}

std::string codesText(VinFacts const& facts)
{
    switch (facts.basis) {
    case WmiRow::Basis::Fact:
        return facts.codes + "'s meanings, used by default";
    case WmiRow::Basis::Guess:
        return fmt::format("perhaps {}'s meanings: --make \"{}\"", facts.codes, facts.codes);
    case WmiRow::Basis::None:
        break;
    }
    return facts.maker.empty() ? "" : "no list for this maker";
}

} // namespace

std::string toText(VinFacts const& facts, Style const& style)
{
    return labelledLine("VIN", facts.vin) + labelledLine("Region", facts.region) +
           labelledLine("Country", facts.country) + labelledLine("Maker", makerText(facts)) +
           labelledLine("Model year", yearText(facts)) + labelledLine("Check digit", checkText(facts, style)) +
           labelledLine("Trouble codes", codesText(facts));
}

} // namespace velmora::cli
