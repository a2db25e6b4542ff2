#include "libvelmora/report/vinreport.h"

#include "libvelmora/report/texts/labels.h"

namespace velmora {

namespace {

char const* standingWord(VinFacts const& facts)
{
    return facts.standing == VinFacts::Standing::Listed ? "listed" : "probable";
}

char const* checkWord(VinFacts::CheckDigit check)
{
    static constexpr char const* words[] = {"right", "wrong", "not judged"};
    return words[static_cast<int>(check)];
}

Json yearBasis(VinFacts::YearBasis basis)
{
    switch (basis) {
    case VinFacts::YearBasis::Position:
        return "position 7";
    case VinFacts::YearBasis::Perhaps:
        return "perhaps";
    case VinFacts::YearBasis::None:
        break;
    }
    return nullptr;
}

Json codeList(VinFacts const& facts)
{
    if (facts.codes.empty()) {
        return nullptr;
    }
    return {{"maker", facts.codes}, {"standing", facts.basis == VinFacts::CodesBasis::Fact ? "fact" : "guess"}};
}

} // namespace

std::string makerText(VinFacts const& facts)
{
    if (facts.smallMaker) {
        return texts::smallMaker + (facts.country.empty() ? "" : texts::registeredIn + facts.country);
    }
    bool const sure = facts.maker.empty() || facts.standing == VinFacts::Standing::Listed;
    return sure ? facts.maker : texts::probably + facts.maker;
}

Json toJsonValue(VinFacts const& facts)
{
    return {{"vin", facts.vin},
            {"wmi", facts.vin.substr(0, 3)},
            {"region", textOrNull(facts.region)},
            {"country", textOrNull(facts.country)},
            {"maker", textOrNull(facts.maker)},
            {"makerStanding", facts.maker.empty() ? Json(nullptr) : Json(standingWord(facts))},
            {"smallMaker", facts.smallMaker},
            {"modelYears", facts.years},
            {"modelYearBy", yearBasis(facts.yearBasis)},
            {"checkDigit", checkWord(facts.checkDigit)},
            {"codeList", codeList(facts)}};
}

} // namespace velmora
