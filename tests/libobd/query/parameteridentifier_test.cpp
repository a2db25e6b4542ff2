#include <obd/parameteridentifier.h>

#include <gtest/gtest.h>

namespace {

using obd::ParameterIdentifier;
using obd::Pid2Uid;
using obd::Uid2Pid;

TEST(ParameterIdentifier, NamesItselfInHexadecimal)
{
    EXPECT_EQ(ParameterIdentifier(0x0C).toString(), "$0C");
    EXPECT_EQ(ParameterIdentifier(0x00).toString(), "$00");
    EXPECT_EQ(ParameterIdentifier(ParameterIdentifier::BoostPressure).toString(), "$F7");
    EXPECT_EQ(ParameterIdentifier(0x1A2).toString(), "$1A2");
}

TEST(ParameterIdentifier, GivesTheByteOfTheRequest)
{
    EXPECT_EQ(ParameterIdentifier(0x5C).toOid(), 0x5C);
    EXPECT_EQ(ParameterIdentifier(0x1A2).toOid(), 0xA2);
    EXPECT_EQ(ParameterIdentifier(0x0C).id(), 0x0C);
}

TEST(ParameterIdentifier, UidsCarryTheParameterAndTheIndexOfTheSensor)
{
    EXPECT_EQ(Pid2Uid(ParameterIdentifier::Id(0x0C), 3), 123);
    EXPECT_EQ(Uid2Pid(123), 12);
    EXPECT_EQ(Pid2Uid(0x0C), 120);
    EXPECT_EQ(Pid2Uid(ParameterIdentifier::Id(0x0C)), 120);
    EXPECT_EQ(Pid2Uid(ParameterIdentifier::BoostPressure, 9), 2479);
    EXPECT_EQ(Uid2Pid(2479), ParameterIdentifier::BoostPressure);
}

} // namespace
