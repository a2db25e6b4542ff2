#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/troublecode.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace velmora;

std::shared_ptr<obd::DtcDataModel> model(std::string const& code, std::string const& text, std::string const& maker)
{
    return std::make_shared<obd::DtcDataModel>(code, text, "Powertrain", maker);
}

TEST(TroubleCodeView, BringsTheMeaningsOfACodeTogetherEachOnce)
{
    auto const codes = groupByCode({model("P1000", "One", "Ford"), model("P0133", "Slow", "Generic"),
                                    model("P1000", "Two", "Jaguar"), model("P1000", "One", "Ford")});
    ASSERT_EQ(codes.size(), 2U);
    EXPECT_EQ(codes[0].code, "P1000");
    ASSERT_EQ(codes[0].meanings.size(), 2U);
    EXPECT_EQ(codes[0].meanings[1].maker, "Jaguar");
    EXPECT_EQ(codes[1].code, "P0133");
}

TEST(TroubleCodeView, ShowsTheMeaningThatHoldsOrHowManyThereAre)
{
    TroubleCode code{"P1000", "Powertrain", {{"Ford", "One"}, {"Mercedes-Benz", "Two"}}};
    EXPECT_EQ(toText(code, "  ", true), "  P1000  Ford           One\n"
                                        "         Mercedes-Benz  Two\n");
    EXPECT_EQ(toText(code, "", false), "P1000  -              maker-specific, 2 meanings\n");
    code.maker = "Mercedes-Benz";
    EXPECT_EQ(toText(code, "", false), "P1000  Mercedes-Benz  Two\n");
    code.maker = "Volvo";
    EXPECT_EQ(meaningText(code), "maker-specific, 2 meanings of other makers");
    code = {"P1001", "Powertrain", {{"Ford", "One"}}, {}};
    EXPECT_EQ(meaningText(code), "maker-specific, 1 meaning");
    code = {"P1FFF", "Powertrain", {{"Unknown", "Unknown Trouble Code"}}, "Ford"};
    EXPECT_EQ(meaningText(code), "Unknown Trouble Code");
}

TEST(TroubleCodeView, AMakerComesFirstOnlyInTheMakersRanges)
{
    std::vector<TroubleCode::Meaning> const both = {{"Generic", "All"}, {"Ford", "Own"}};
    for (char const* makers : {"P1105", "P3000", "P33FF", "B1000", "C2000", "U1000"}) {
        EXPECT_TRUE(isMakersCode(makers)) << makers;
        EXPECT_EQ(meaningText({makers, "", both, "Ford"}), "Own") << makers;
        EXPECT_EQ(meaningText({makers, "", both, ""}), "All") << makers;
    }
    for (char const* standard : {"P0105", "P2105", "P3400", "B0100", "C0000", "U0100", "U3000", "P1"}) {
        EXPECT_FALSE(isMakersCode(standard)) << standard;
        EXPECT_EQ(meaningText({standard, "", both, "Ford"}), "All") << standard;
    }
}

TEST(TroubleCodeView, WritesCodeSystemAndMeaningsAsJson)
{
    EXPECT_EQ(toJsonValue(TroubleCode{"P1000", "Powertrain", {{"Ford", "One"}}, "Ford"}).dump(),
              R"({"code":"P1000","system":"Powertrain","meaning":{"maker":"Ford","text":"One"},)"
              R"("meanings":[{"maker":"Ford","text":"One"}]})");
    EXPECT_TRUE(toJsonValue(TroubleCode{"P1000", "Powertrain", {{"Ford", "One"}}, {}})["meaning"].is_null());
}

} // namespace
