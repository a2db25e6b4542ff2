#include "libobd/message/messageentry.h"
#include "tests/support/bytes.h"
#include "tests/support/fakeclock.h"

#include <common/localtime.h>

#include <gtest/gtest.h>

namespace {

using obd::MessageDataModel;
using support::bytes;

std::time_t localSeconds(int hour, int minute, int second)
{
    std::tm fields{};
    fields.tm_year = 124;
    fields.tm_mon = 2;
    fields.tm_mday = 7;
    fields.tm_hour = hour;
    fields.tm_min = minute;
    fields.tm_sec = second;
    fields.tm_isdst = -1;
    return tervex::fromLocalTime(fields);
}

TEST(MessageDataModel, DirectionIsShownAsAnArrow)
{
    MessageDataModel model;
    EXPECT_EQ(model.direction, 0);
    EXPECT_EQ(model.getDirectionStr(), "<<");
    model.direction = 1;
    EXPECT_EQ(model.getDirectionStr(), ">>");
    for (int other : {2, -1, 255}) {
        model.direction = other;
        EXPECT_EQ(model.getDirectionStr(), "<<") << other;
    }
}

TEST(MessageEntry, CarriesTimeDirectionAndText)
{
    support::FakeClock const clock(1000, localSeconds(9, 5, 2));
    auto const sent = obd::makeMessageEntry(bytes("ATI\r"), MessageDataModel::Sent);
    EXPECT_EQ(sent->time, "09:05:02");
    EXPECT_EQ(sent->direction, 1);
    EXPECT_EQ(sent->data, "ATI");

    auto const received = obd::makeMessageEntry(bytes("41 00\r41 00\r\r"), MessageDataModel::Received);
    EXPECT_EQ(received->direction, 0);
    EXPECT_EQ(received->data, "41 0041 00") << "several lines become one run of text";
}

TEST(MessageEntry, EveryTimeFieldTakesTwoDigits)
{
    support::FakeClock clock(1000, localSeconds(0, 0, 0));
    EXPECT_EQ(obd::makeMessageEntry({}, 0)->time, "00:00:00");
    clock.setWallSeconds(localSeconds(23, 59, 58));
    EXPECT_EQ(obd::makeMessageEntry({}, 0)->time, "23:59:58");
}

TEST(MessageEntry, FramingGoesAndAQuestionMarkStays)
{
    auto const entry = obd::makeMessageEntry(bytes(std::string_view("\0\r\n>A\0T>\r?\n", 11)), 0);
    EXPECT_EQ(entry->data, "AT?");
}

} // namespace
