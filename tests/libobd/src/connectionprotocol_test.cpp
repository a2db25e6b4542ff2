#include <gtest/gtest.h>
#include <obd/connectionprotocol.h>

namespace {

TEST(ConnectionProtocol, EveryProtocolHasItsName)
{
    std::vector<std::string> names;
    for (int number = 0; number < 10; ++number) {
        names.push_back(obd::ConnectionProtocol(static_cast<obd::VehicleProtocol>(number)).description());
    }
    EXPECT_EQ(names, (std::vector<std::string>{"Automatic", "SAE J1850 PWM", "SAE J1850 VPW", "ISO 9141-2",
                                               "ISO 14230-4 KWP (5 baud init)", "ISO 14230-4 KWP (fast init)",
                                               "ISO 15765-4 CAN (11bit, 500kb)", "ISO 15765-4 CAN (29bit, 500kb)",
                                               "ISO 15765-4 CAN (11bit, 250kb)", "ISO 15765-4 CAN (29bit, 250kb)"}));
}

TEST(ConnectionProtocol, NumberOutsideTheTableHasNoName)
{
    EXPECT_EQ(obd::ConnectionProtocol(static_cast<obd::VehicleProtocol>(10)).description(), "");
    EXPECT_EQ(obd::ConnectionProtocol(static_cast<obd::VehicleProtocol>(-1)).description(), "");
}

} // namespace
