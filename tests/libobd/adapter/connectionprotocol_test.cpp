#include <obd/connectionprotocol.h>

#include <gtest/gtest.h>

namespace {

TEST(ConnectionProtocol, EveryNumberHasItsNameAndFamily)
{
    struct Row
    {
        int number;
        char const* description;
        int family;
    };
    for (Row const row :
         {Row{0, "Automatic", 5}, Row{1, "SAE J1850 PWM", 2}, Row{2, "SAE J1850 VPW", 2}, Row{3, "ISO 9141-2", 0},
          Row{4, "ISO 14230-4 KWP (5 baud init)", 1}, Row{5, "ISO 14230-4 KWP (fast init)", 1},
          Row{6, "ISO 15765-4 CAN (11bit, 500kb)", 3}, Row{7, "ISO 15765-4 CAN (29bit, 500kb)", 4},
          Row{8, "ISO 15765-4 CAN (11bit, 250kb)", 3}, Row{9, "ISO 15765-4 CAN (29bit, 250kb)", 4}}) {
        auto const number = static_cast<obd::VehicleProtocol>(row.number);
        obd::ConnectionProtocol const protocol(number);
        EXPECT_EQ(protocol.protocol(), number);
        EXPECT_EQ(protocol.description(), row.description);
        EXPECT_EQ(static_cast<int>(obd::toObdProtocol(number)), row.family) << row.number;
    }
}

TEST(ConnectionProtocol, OtherNumbersAreUnknown)
{
    for (int number : {10, -1, 255}) {
        auto const protocol = static_cast<obd::VehicleProtocol>(number);
        EXPECT_EQ(obd::toObdProtocol(protocol), obd::ObdProtocolUnknown) << number;
        EXPECT_EQ(obd::ConnectionProtocol(protocol).description(), "") << number;
    }
}

} // namespace
