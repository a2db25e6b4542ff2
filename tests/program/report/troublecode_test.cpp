#include "libvelmora/report/troublecode.h"
#include "program/view/reporttext.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace velmora;
using namespace velmora::cli;

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

TEST(TroubleCodeView, NamesTheCodeOnItsFirstLineOnly)
{
    TroubleCode const code{"P1000", "Powertrain", {{"Ford", "One"}, {"Mercedes-Benz", "Two"}}};
    EXPECT_EQ(toText(code, "  "), "  P1000  Ford           One\n"
                                  "         Mercedes-Benz  Two\n");
}

TEST(TroubleCodeView, WritesCodeSystemAndMeaningsAsJson)
{
    auto const json = toJsonValue(TroubleCode{"P1000", "Powertrain", {{"Ford", "One"}}});
    EXPECT_EQ(json.dump(), R"({"code":"P1000","system":"Powertrain","meanings":[{"maker":"Ford","text":"One"}]})");
}

} // namespace
