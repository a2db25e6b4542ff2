#include "libvelmora/report/freezereport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace velmora;

std::vector<ModuleTopic<FreezeReport>> const modules = {
    {0x7E8,
     "ECM",
     {2, TopicAnswer::Read,
      FreezeFrame{{"P0133", "Powertrain", {{"Generic", "Slow"}}},
                  {{"Engine RPM", "2355", "rpm"}, {"Fuel", "Closed loop", ""}, {"Speed", std::nullopt, "km/h"}}}}},
    {0x7E9, "TCM", {2, TopicAnswer::Read, std::nullopt}},
    {0x7EA, "", {2, TopicAnswer::Silent, std::nullopt}},
    {0x7EB, "", {2, TopicAnswer::Unreadable, std::nullopt}},
};

TEST(FreezeReportView, ShowsCodeThenNamesValuesAndUnits)
{
    EXPECT_EQ(toText(modules, Style()), "Control module 7E8: ECM\n"
                                        "  Freeze frame   2\n"
                                        "    P0133  Generic        Slow\n"
                                        "    Engine RPM  2355 rpm\n"
                                        "    Fuel        Closed loop\n"
                                        "    Speed       -\n"
                                        "\nControl module 7E9: TCM\n"
                                        "  Freeze frame   2: none stored\n"
                                        "\nControl module 7EA\n"
                                        "  Freeze frame   2: no answer\n"
                                        "\nControl module 7EB\n"
                                        "  Freeze frame   2: unreadable\n");
}

TEST(FreezeReportView, GivesTheCodeThatSetItTheMakersMeaning)
{
    FreezeReport report{0, TopicAnswer::Read,
                        FreezeFrame{{"P1105", "Powertrain", {{"Acura", "A"}, {"Ford", "F"}}}, {}}};
    auto const text = [&report](MakerChoice const& maker) {
        applyMaker(report, maker);
        return toText(report, Style());
    };
    EXPECT_EQ(text({MakerChoice::By::Vin, "Ford"}), "  Freeze frame   0\n    P1105  Ford           F\n");
    EXPECT_EQ(text({MakerChoice::By::Guess, "Ford"}),
              "  Freeze frame   0\n    P1105  -              maker-specific, 2 meanings\n");
    FreezeReport none{0, TopicAnswer::Silent, std::nullopt};
    applyMaker(none, {MakerChoice::By::Vin, "Ford"});
    EXPECT_FALSE(none.frame);
}

TEST(FreezeReportView, JsonHasNullForWhatIsMissing)
{
    auto const json = nlohmann::json::parse(toJson(modules));
    EXPECT_EQ(json[0]["name"], "ECM");
    EXPECT_EQ(json[0]["frame"], 2);
    EXPECT_EQ(json[0]["freeze"]["code"]["code"], "P0133");
    auto const& readings = json[0]["freeze"]["readings"];
    EXPECT_EQ(readings[0]["value"], "2355");
    EXPECT_EQ(readings[0]["unit"], "rpm");
    EXPECT_TRUE(readings[1]["unit"].is_null());
    EXPECT_TRUE(readings[2]["value"].is_null());
    EXPECT_TRUE(json[1]["freeze"].is_null());
    EXPECT_EQ(json[1]["answered"], true);
    EXPECT_EQ(json[2]["answered"], false);
    EXPECT_EQ(json[2]["answer"], "no answer");
    EXPECT_EQ(json[3]["answer"], "unreadable");
    EXPECT_TRUE(json[2]["name"].is_null());
}

} // namespace
