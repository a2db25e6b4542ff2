#include "program/view/trafficlog.h"

#include <gtest/gtest.h>

using namespace velmora;
using namespace velmora::cli;

TEST(TrafficLog, showsTimeDirectionAndText)
{
    EXPECT_EQ(toLine({"09:05:02", obd::MessageDataModel::Sent, "010C"}), "09:05:02 >> 010C\n");
    EXPECT_EQ(toLine({"09:05:02", obd::MessageDataModel::Received, "7E804410C1AF8"}), "09:05:02 << 7E804410C1AF8\n");
}

TEST(TrafficLog, writesOneLineOfJson)
{
    EXPECT_EQ(toJsonLine({"09:05:02", obd::MessageDataModel::Sent, "ATZ"}),
              "{\"time\":\"09:05:02\",\"direction\":\"sent\",\"data\":\"ATZ\"}\n");
    EXPECT_EQ(toJsonLine({"09:05:02", obd::MessageDataModel::Received, "\xFC\"?"}),
              "{\"time\":\"09:05:02\",\"direction\":\"received\",\"data\":\"\xEF\xBF\xBD\\\"?\"}\n")
        << "line noise is no UTF-8";
}
