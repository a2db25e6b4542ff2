#include "libobd/connection/configuration.h"

#include <gtest/gtest.h>

namespace {

TEST(Configuration, RatesReplaceWhatTheVectorHeld)
{
    obd::Configuration const configuration;
    std::vector<int> rates{1, 2, 3};
    configuration.supportedBaudrates(rates);
    EXPECT_EQ(rates, (std::vector<int>{9600, 19200, 38400, 57600, 115200}));
    configuration.supportedInitialBaudrates(rates);
    EXPECT_EQ(rates, (std::vector<int>{9600, 19200, 38400, 57600}));
}

TEST(Configuration, BusesAreAppended)
{
    std::vector<int> buses{9};
    obd::Configuration().supportedBuses(buses);
    EXPECT_EQ(buses, (std::vector<int>{9, 0, 1, 2}));
}

TEST(Configuration, ProtocolsAreAppendedByNumber)
{
    std::vector<obd::ConnectionProtocol> protocols{obd::ConnectionProtocol(obd::VehicleProtocol::Iso9141)};
    obd::Configuration().supportedProtocols(protocols);
    ASSERT_EQ(protocols.size(), 11U);
    for (int number = 0; number < 10; ++number) {
        EXPECT_EQ(static_cast<int>(protocols[static_cast<std::size_t>(number) + 1].protocol()), number);
    }
}

} // namespace
