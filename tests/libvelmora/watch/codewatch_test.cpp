#include "libvelmora/watch/codewatch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using velmora::CodeLook;
using velmora::CodeWatch;

std::vector<std::string> news(CodeWatch& watch, CodeLook const& look)
{
    std::vector<std::string> result;
    for (velmora::Record const& each : watch.take(look, {})) {
        if (auto const* const event = std::get_if<velmora::Event>(&each)) {
            result.push_back(event->kind);
        } else if (auto const* const change = std::get_if<velmora::CodeChange>(&each)) {
            result.push_back((change->present ? "+" : "-") + change->code + change->kind);
        }
    }
    return result;
}

CodeLook lookAt(std::optional<bool> lamp, std::optional<std::vector<CodeLook::Code>> confirmed)
{
    return {0x7E8, lamp, {{"confirmed", std::move(confirmed)}}, {}};
}

TEST(CodeWatch, TellsWhatCameAndWent)
{
    CodeWatch watch("van");
    EXPECT_THAT(news(watch, lookAt(false, {{{"P0301", "a"}}})), ElementsAre("+P0301confirmed"));
    EXPECT_THAT(news(watch, lookAt(false, {{{"P0301", "a"}}})), IsEmpty());
    EXPECT_THAT(news(watch, lookAt(true, {{{"P0301", "a"}, {"P0420", "b"}, {"P0420", "b"}}})),
                ElementsAre("lamp_on", "+P0420confirmed", "code_new"));
    EXPECT_THAT(news(watch, lookAt(false, {{{"P0420", "b"}}})),
                ElementsAre("lamp_off", "-P0301confirmed", "code_gone"));
}

TEST(CodeWatch, AListThatWasNotToldChangesNothing)
{
    CodeWatch watch("van");
    news(watch, lookAt(true, {{{"P0301", "a"}}}));
    EXPECT_THAT(news(watch, lookAt({}, {})), IsEmpty());
    EXPECT_THAT(news(watch, lookAt(true, {{{"P0301", "a"}}})), IsEmpty());
    EXPECT_THAT(news(watch, lookAt(true, {{}})), ElementsAre("-P0301confirmed", "code_gone"));
}

TEST(CodeWatch, ALampThatIsOnAtFirstIsTold)
{
    CodeWatch watch("van");
    EXPECT_THAT(news(watch, lookAt(true, {})), ElementsAre("lamp_on"));
    EXPECT_THAT(news(watch, lookAt(true, {})), IsEmpty());
    EXPECT_THAT(news(watch, lookAt(false, {})), ElementsAre("lamp_off"));
    EXPECT_THAT(news(watch, lookAt(false, {})), IsEmpty());
}

TEST(CodeWatch, NamesVehicleModuleAndTimeInAllThatItTells)
{
    CodeWatch watch("van");
    velmora::WallTime const time{std::chrono::hours(1)};
    std::vector<std::string> told;
    auto const take = [&](CodeLook const& look) {
        told.clear();
        for (velmora::Record const& each : watch.take(look, time)) {
            if (auto const* const event = std::get_if<velmora::Event>(&each)) {
                EXPECT_EQ(event->module, look.module);
                EXPECT_EQ(event->vehicle, "van");
                EXPECT_EQ(event->time, time);
                told.push_back(event->text);
            } else if (auto const* const change = std::get_if<velmora::CodeChange>(&each)) {
                EXPECT_EQ(change->module, look.module);
                EXPECT_EQ(change->vehicle, "van");
                EXPECT_EQ(change->time, time);
                told.push_back(change->code + (change->present ? " came: " : " went: ") + change->text);
            } else {
                auto const& lamp = std::get<velmora::LampState>(each);
                EXPECT_EQ(lamp.vehicle + std::to_string(lamp.module), "van" + std::to_string(look.module));
                EXPECT_EQ(lamp.time, time);
            }
        }
        return told;
    };
    EXPECT_THAT(take({1, true, {{"pending", std::vector<CodeLook::Code>()}}, 2}),
                ElementsAre("The malfunction lamp is on"));
    EXPECT_THAT(take({1, false, {{"pending", {{{"P0301", "Misfire"}}}}}, 0}),
                ElementsAre("The malfunction lamp is off", "P0301 came: Misfire", "P0301 (pending) Misfire",
                            "All monitors have run"));
    EXPECT_THAT(take({2, {}, {{"pending", {{{"P0301", "Misfire"}}}}}, 1}), ElementsAre("P0301 came: Misfire"))
        << "another module, at its first look";
    EXPECT_THAT(take({1, {}, {{"pending", std::vector<CodeLook::Code>()}}, 1}),
                ElementsAre("P0301 went: Misfire", "P0301 (pending) Misfire", "Monitors have not run"));
}

TEST(CodeWatch, TellsTheLampAtEachLookThatKnowsIt)
{
    CodeWatch watch("van");
    std::vector<bool> lamps;
    for (std::optional<bool> const lamp :
         {std::optional(false), std::optional<bool>(), std::optional(true), std::optional(true)}) {
        for (velmora::Record const& each : watch.take(lookAt(lamp, {}), {})) {
            if (auto const* const state = std::get_if<velmora::LampState>(&each)) {
                EXPECT_EQ(state->module, 0x7E8U);
                lamps.push_back(state->on);
            }
        }
    }
    EXPECT_THAT(lamps, ElementsAre(false, true, true));
}

TEST(CodeWatch, TellsWhenAllMonitorsHaveRunAndWhenNotAnyMore)
{
    CodeWatch watch("van");
    CodeLook look{0x7E8, {}, {}, 3};
    EXPECT_THAT(news(watch, look), IsEmpty());
    look.notReady = 2;
    EXPECT_THAT(news(watch, look), IsEmpty());
    look.notReady = 0;
    EXPECT_THAT(news(watch, look), ElementsAre("ready"));
    look.notReady = 5;
    EXPECT_THAT(news(watch, look), ElementsAre("not_ready"));
}

} // namespace
