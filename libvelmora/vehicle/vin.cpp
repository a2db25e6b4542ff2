#include "libvelmora/vehicle/vin.h"

#include "common/text/text.h"
#include "libvelmora/vehicle/wmitable.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <chrono>
#include <string_view>

namespace velmora {

namespace {

constexpr std::size_t vinLength = 17;
constexpr std::size_t checkPlace = 8;
constexpr std::size_t yearPlace = 9;
constexpr std::size_t roundPlace = 6; // of the North American rule
constexpr int firstYear = 1980;
constexpr int yearsARound = 30;
constexpr std::string_view yearCharacters = "ABCDEFGHJKLMNPRSTVWXY123456789";

bool isDigit(char character)
{
    return character >= '0' && character <= '9';
}

bool isVinCharacter(char character)
{
    bool const letter =
        character >= 'A' && character <= 'Z' && character != 'I' && character != 'O' && character != 'Q';
    return letter || isDigit(character);
}

// The value of a character in the sum of 49 CFR 565.15: digits as they are, letters by groups of nine.
int transliterated(char character)
{
    if (isDigit(character)) {
        return character - '0';
    }
    constexpr std::string_view values = "12345678.12345.7.923456789"; // A to Z
    return values[static_cast<std::size_t>(character - 'A')] - '0';
}

char computeCheckDigit(std::string const& vin)
{
    constexpr int weights[vinLength] = {8, 7, 6, 5, 4, 3, 2, 10, 0, 9, 8, 7, 6, 5, 4, 3, 2};
    int sum = 0;
    for (std::size_t i = 0; i < vinLength; ++i) {
        sum += weights[i] * transliterated(vin[i]);
    }
    int const rest = sum % 11;
    return rest == 10 ? 'X' : static_cast<char>('0' + rest);
}

// 7A to 7E were New Zealand's before 7 became North America's.
bool isNorthAmerican(std::string const& vin)
{
    return (vin[0] >= '1' && vin[0] <= '5') || (vin[0] == '7' && !(vin[1] >= 'A' && vin[1] <= 'E'));
}

void decodeMaker(VinFacts& facts, std::string_view wmi)
{
    facts.region = regionOfWmi(wmi);
    facts.country = countryOfWmi(wmi);
    facts.smallMaker = wmi[2] == '9';
    if (WmiRow const* const row = findWmi(wmi)) {
        facts.maker = row->maker;
        facts.standing = row->standing;
        facts.codes = row->codes;
        facts.basis = row->basis;
    }
}

void decodeYear(VinFacts& facts, int thisYear)
{
    std::size_t const index = yearCharacters.find(facts.vin[yearPlace]);
    if (index == std::string_view::npos) {
        return;
    }
    int const early = firstYear + static_cast<int>(index);
    int const late = early + yearsARound;
    WmiRow const* const row = findWmi(std::string_view(facts.vin).substr(0, 3));
    bool const heavy = row != nullptr && row->make == WmiRow::Make::Heavy;
    if (isNorthAmerican(facts.vin) && !heavy && !facts.smallMaker) {
        facts.yearBasis = VinFacts::YearBasis::Position;
        facts.years = {isDigit(facts.vin[roundPlace]) ? early : late};
    } else {
        facts.yearBasis = VinFacts::YearBasis::Perhaps;
        facts.years = {early, late};
    }
    std::erase_if(facts.years, [thisYear](int year) { return year > thisYear + 1; });
}

void judgeCheckDigit(VinFacts& facts)
{
    facts.computedCheck = computeCheckDigit(facts.vin);
    if (facts.vin[checkPlace] == facts.computedCheck) {
        facts.checkDigit = VinFacts::CheckDigit::Right;
    } else if (isNorthAmerican(facts.vin)) {
        facts.checkDigit = VinFacts::CheckDigit::Wrong;
    }
}

[[noreturn]] void failLength(std::string const& vin)
{
    std::vector<std::string> hints = {"count the characters once more; blanks and hyphens do not matter"};
    if (vin.size() < vinLength) {
        hints.emplace_back("a vehicle older than 1981 may have a shorter number, which no standard describes");
    }
    throw Error(
        ErrorKind::WrongUse,
        fmt::format("\"{}\" has {} characters; a vehicle identification number has {}", vin, vin.size(), vinLength),
        hints);
}

[[noreturn]] void failCharacter(std::string const& vin, char wrong)
{
    std::string hint = "it has the letters A to Z without I, O and Q, and digits";
    if (wrong == 'I') {
        hint = "I is not used: is it a 1?";
    } else if (wrong == 'O' || wrong == 'Q') {
        hint = fmt::format("{} is not used: is it a 0?", wrong);
    }
    throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no vehicle identification number", readable(vin)), {hint});
}

} // namespace

bool isVin(std::string const& text)
{
    return text.size() == vinLength && std::all_of(text.begin(), text.end(), isVinCharacter);
}

std::string parseVin(std::string const& text)
{
    std::string vin = toUpper(text);
    std::erase_if(vin, [](char character) { return character == ' ' || character == '-'; });
    auto const wrong = std::find_if_not(vin.begin(), vin.end(), isVinCharacter);
    if (wrong != vin.end()) {
        failCharacter(vin, *wrong);
    }
    if (vin.size() != vinLength) {
        failLength(vin);
    }
    return vin;
}

VinFacts decodeVin(std::string const& vin, int thisYear)
{
    VinFacts facts;
    facts.vin = vin;
    decodeMaker(facts, std::string_view(vin).substr(0, 3));
    decodeYear(facts, thisYear);
    judgeCheckDigit(facts);
    return facts;
}

VinFacts explainVin(std::string const& text)
{
    using namespace std::chrono;
    auto const thisYear = year_month_day(floor<days>(system_clock::now())).year();
    return decodeVin(parseVin(text), static_cast<int>(thisYear));
}

} // namespace velmora
