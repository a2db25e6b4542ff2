#include "libvelmora/poll/pollchoice.h"
#include "tests/support/fakeecu.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gtest/gtest.h>

namespace {

using velmora::ModuleOffer;

class PollChoiceTest : public testing::Test
{
protected:
    PollChoiceTest() { m_offers[0].meant = true; }

    static ModuleOffer offer(unsigned int id, std::vector<int> const& pids)
    {
        ModuleOffer result{std::make_shared<support::FakeEcu>(id), {}, false};
        for (int const pid : pids) {
            result.sensors.push_back({obd::ParameterIdentifier(pid).id(), fmt::format("Title {:02X}", pid)});
        }
        return result;
    }

    std::string choose(std::vector<std::string> const& words, std::optional<double> hertz = {})
    {
        std::string text;
        for (velmora::PollChoice const& each : choosePolled(words, m_offers, hertz)) {
            text += fmt::format("{}{:X}:{:02X}{}", text.empty() ? "" : " ", each.ecu->id(), static_cast<int>(each.id),
                                each.hertz ? fmt::format("@{}", *each.hertz) : "");
        }
        return text;
    }

    std::vector<ModuleOffer> m_offers{offer(0x7E8, {0x05, 0x0C, 0x0D}), offer(0x7E9, {0x05, 0x11})};
};

TEST_F(PollChoiceTest, WordsMeanTheModulesThatAreMeantAndThoseTheyName)
{
    EXPECT_EQ(choose({"RPM", "7E9:05@0.5hz", "SPEED@5"}), "7E8:0C 7E9:05@0.5 7E8:0D@5");
    EXPECT_EQ(choose({}), "7E8:0D 7E8:0C 7E8:05");
    m_offers[1].meant = true;
    EXPECT_EQ(choose({"RPM", "05"}), "7E8:0C 7E8:05 7E9:05"); // the second module has no engine speed
    EXPECT_EQ(choose({"all"}, 2.0), "7E8:05@2 7E8:0C@2 7E8:0D@2 7E9:05@2 7E9:11@2");
}

TEST_F(PollChoiceTest, NoneTwiceAndTheLaterRateCounts)
{
    EXPECT_EQ(choose({"RPM@10hz", "05", "0C@2"}, 1.0), "7E8:0C@2 7E8:05@1");
}

TEST_F(PollChoiceTest, WhatIsNotOfferedIsRefused)
{
    EXPECT_THROW(choose({"7EA:RPM"}), velmora::Error);
    EXPECT_THROW(choose({"7E9:RPM"}), velmora::Error);
    EXPECT_THROW(choose({"11"}), velmora::Error); // only the other module has it
}

} // namespace
