#include "libvelmora/report/vinreport.h"
#include "libvelmora/vehicle/makerchoice.h"
#include "libvelmora/vehicle/vin.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using Years = std::vector<int>;
using Check = VinFacts::CheckDigit;
using YearBasis = VinFacts::YearBasis;

constexpr int yearOfTests = 2026;

struct VinCase
{
    char const* vin;
    Years years;
    YearBasis basis;
    Check check;
};

TEST(Vin, TellsModelYearAndCheckDigitByTheMarket)
{
    std::vector<VinCase> const cases = {
        {"1M8GDM9AXKP042788", {1989}, YearBasis::Position, Check::Right},
        {"1M8GDM9A1KP042788", {1989}, YearBasis::Position, Check::Wrong},
        {"1G1JC5444R7252367", {1994}, YearBasis::Position, Check::Right},
        {"1D4GP00R55B123456", {2005}, YearBasis::Position, Check::Wrong},
        {"1FTEX1C85AF000001", {2010}, YearBasis::Position, Check::Right},
        {"1FTEX108XAF000001", {1980}, YearBasis::Position, Check::Right},
        {"2T1BR32EXXC000001", {1999}, YearBasis::Position, Check::Right},
        {"LRW3E7FAXMC000001", {1991, 2021}, YearBasis::Perhaps, Check::Right},
        {"WVWZZZ1JZXW000001", {1999}, YearBasis::Perhaps, Check::NotJudged},
        {"TMBZZZ1Z000000001", {}, YearBasis::None, Check::NotJudged},
        {"WVWZZZ1JZUW000001", {}, YearBasis::None, Check::NotJudged},
        {"1A9AB1237K1234567", {1989, 2019}, YearBasis::Perhaps, Check::Right},
        {"1M2GDM9A1KP042788", {1989, 2019}, YearBasis::Perhaps, Check::Wrong},
        {"7A3GDM9A1KP042788", {1989, 2019}, YearBasis::Perhaps, Check::NotJudged},
        {"11111111111111111", {2001}, YearBasis::Position, Check::Right},
        {"7E3GDM9A1KP042788", {1989, 2019}, YearBasis::Perhaps, Check::NotJudged},
        {"7F3GDM9A1KP042788", {1989}, YearBasis::Position, Check::Wrong},
        {"73SGDM9A1KP042788", {1989}, YearBasis::Position, Check::Wrong},
        {"5M8GDM9A1KP042788", {1989}, YearBasis::Position, Check::Wrong},
        {"6M8GDM9A1KP042788", {1989, 2019}, YearBasis::Perhaps, Check::NotJudged},
    };
    for (VinCase const& each : cases) {
        VinFacts const facts = decodeVin(each.vin, yearOfTests);
        EXPECT_EQ(facts.years, each.years) << each.vin;
        EXPECT_EQ(facts.yearBasis, each.basis) << each.vin;
        EXPECT_EQ(facts.checkDigit, each.check) << each.vin;
    }
    EXPECT_EQ(decodeVin("1M8GDM9A1KP042788", yearOfTests).computedCheck, 'X');
}

TEST(Vin, KnowsNoYearMoreThanOneBehindTheDay)
{
    EXPECT_EQ(decodeVin("WVWZZZ1JZVW000001", 2026).years, Years({1997, 2027}));
    EXPECT_EQ(decodeVin("WVWZZZ1JZVW000001", 2025).years, Years({1997}));
}

TEST(Vin, NamesRegionCountryAndMaker)
{
    VinFacts const sure = decodeVin("WVWZZZ1JZXW000001", yearOfTests);
    EXPECT_EQ(sure.region, "Europe");
    EXPECT_EQ(sure.country, "Germany");
    EXPECT_EQ(makerText(sure), "Volkswagen");
    EXPECT_EQ(makerText(decodeVin("1FZZZZ1JZXW000001", yearOfTests)), "probably Ford");
    VinFacts const small = decodeVin("1A9AB1237K1234567", yearOfTests);
    EXPECT_EQ(makerText(small), "a small maker registered in United States");
    EXPECT_TRUE(small.codes.empty());
    EXPECT_TRUE(decodeVin("VF9ZZZ1JZXW000001", yearOfTests).maker.empty()) << "shared by small makers";
    VinFacts const unknown = decodeVin("00000000000000000", yearOfTests);
    EXPECT_TRUE(unknown.region.empty() && unknown.country.empty() && makerText(unknown).empty());
    for (auto const& [first, region] : {std::pair('A', "Africa"),
                                        {'H', "Asia"},
                                        {'R', "Asia"},
                                        {'S', "Europe"},
                                        {'5', "North America"},
                                        {'7', "North America"},
                                        {'6', "Oceania"},
                                        {'8', "South America"},
                                        {'9', "South America"},
                                        {'D', ""}}) {
        EXPECT_EQ(decodeVin(first + std::string("ZZZZZ1JZXW000001"), yearOfTests).region, region) << first;
    }
}

TEST(Vin, ChoosesAListOfCodesOnlyWhereItIsTheMakersOwn)
{
    auto const holding = [](std::vector<std::string> const& vins) { return chooseMaker("", vins).holding(); };
    EXPECT_EQ(holding({"WVWZZZ1JZXW000001"}), "Volkswagen");
    EXPECT_EQ(holding({"", "WVW", std::string(17, '\xFF'), "1G3ZZZ1JZXW000001"}), "GM")
        << "the catalogue's Oldsmobile list is Ford's";
    EXPECT_EQ(holding({"WVXZZZ1JZXW000001"}), "") << "a guess by the first two characters";
    EXPECT_EQ(chooseMaker("", {"WVXZZZ1JZXW000001"}).maker, "Volkswagen") << "which is offered";
    EXPECT_EQ(chooseMaker("", {"UU1ZZZ1JZXW000001"}).by, MakerChoice::By::Nothing) << "without a list";
    EXPECT_EQ(chooseMaker("", {}).by, MakerChoice::By::Nothing);
    EXPECT_EQ(chooseMaker("Ford", {"WVWZZZ1JZXW000001"}).holding(), "Ford") << "the user knows better";
}

TEST(Vin, IsReadAsTypedAndRefusedWithAReason)
{
    EXPECT_EQ(parseVin(" 1m8gdm9a-xk-p042788 "), "1M8GDM9AXKP042788");
    for (auto const& [text, hint] : {std::pair("1M8GDM9AXKPO42788", "is it a 0"),
                                     {"IM8GDM9AXKP042788", "is it a 1"},
                                     {"1M8GDM9AXKP04278", "count"},
                                     {"1M8GDM9AXKP0427888", "count"},
                                     {"1M8GDM9AXKP04278\xC3", "letters A to Z"},
                                     {"", "count"}}) {
        try {
            parseVin(text);
            ADD_FAILURE() << text;
        } catch (Error const& error) {
            EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
            EXPECT_NE(error.hints().at(0).find(hint), std::string::npos) << error.hints().at(0);
        }
    }
    EXPECT_FALSE(isVin("1m8gdm9axkp042788"));
}

TEST(Vin, IsRefusedInWholeSentences)
{
    auto const problem = [](std::string const& text) {
        try {
            parseVin(text);
        } catch (Error const& error) {
            std::string all = error.what();
            for (std::string const& hint : error.hints()) {
                all += " | " + hint;
            }
            return all;
        }
        return std::string();
    };
    std::string const count = " | count the characters once more; blanks and hyphens do not matter";
    EXPECT_EQ(problem("1M8GDM9AXKP04278"),
              "\"1M8GDM9AXKP04278\" has 16 characters; a vehicle identification number has 17" + count +
                  " | a vehicle older than 1981 may have a shorter number, which no standard describes");
    EXPECT_EQ(problem("1M8GDM9AXKP0427888"),
              "\"1M8GDM9AXKP0427888\" has 18 characters; a vehicle identification number has 17" + count);
    EXPECT_EQ(problem("qM8"), "\"QM8\" is no vehicle identification number | Q is not used: is it a 0?");
    EXPECT_EQ(problem("Im8"), "\"IM8\" is no vehicle identification number | I is not used: is it a 1?");
    EXPECT_EQ(problem("a+"),
              "\"A+\" is no vehicle identification number | it has the letters A to Z without I, O and Q, "
              "and digits");
    for (char const* const odd : {"@", "[", "/", ":"}) {
        EXPECT_FALSE(isVin("1M8GDM9AXKP04278" + std::string(odd))) << odd;
    }
    EXPECT_TRUE(isVin("1M8GDM9AXKP04270") == false && isVin("1M8GDM9AXKP0427ZA") && isVin("1M8GDM9AXKP042709"));
}

TEST(Vin, IsToldAsJson)
{
    EXPECT_EQ(toJsonValue(decodeVin("1G3JC5444R7252367", yearOfTests)).dump(),
              R"({"vin":"1G3JC5444R7252367","wmi":"1G3","region":"North America","country":"United States",)"
              R"("maker":"Oldsmobile","makerStanding":"listed","smallMaker":false,"modelYears":[1994],)"
              R"("modelYearBy":"position 7","checkDigit":"wrong","codeList":{"maker":"GM","standing":"fact"}})");
    Json const small = toJsonValue(decodeVin("1A9AB1237K1234567", yearOfTests));
    EXPECT_TRUE(small["maker"].is_null() && small["makerStanding"].is_null() && small["codeList"].is_null());
    EXPECT_EQ(small["modelYearBy"], "perhaps");
}

} // namespace
