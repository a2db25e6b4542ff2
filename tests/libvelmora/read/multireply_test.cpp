#include "libvelmora/poll/multilimit.h"
#include "libvelmora/read/multireply.h"
#include "tests/support/hexbytes.h"

#include <obd/parameterfactory.h>

#include <gtest/gtest.h>

namespace {

using support::hexBytes;
using velmora::MultiLimit;

using Bytes = std::vector<unsigned char>;

auto split(char const* payload, char const* asked)
{
    return velmora::splitMultiReply(hexBytes(payload), hexBytes(asked), [](unsigned char pid) {
        return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id());
    });
}

TEST(MultiReply, DividesByTheKnownLengthsInAnyOrder)
{
    // The worked pair of an adapter's data sheet: the order is not that of the request.
    for (char const* payload : {"41 04 3F 05 44 0B 21 0C 17 B8", "41 0B 21 04 3F 0C 17 B8 05 44"}) {
        auto const parts = split(payload, "04 05 0B 0C");
        ASSERT_TRUE(parts.has_value()) << payload;
        EXPECT_EQ(parts->size(), 4U);
        EXPECT_EQ(parts->at(0x04), hexBytes("41 04 3F"));
        EXPECT_EQ(parts->at(0x05), hexBytes("41 05 44"));
        EXPECT_EQ(parts->at(0x0B), hexBytes("41 0B 21"));
        EXPECT_EQ(parts->at(0x0C), hexBytes("41 0C 17 B8"));
    }
}

TEST(MultiReply, AModuleMayLeaveOut)
{
    auto const parts = split("41 0D 00", "0C 0D");
    ASSERT_TRUE(parts.has_value());
    EXPECT_EQ(parts->size(), 1U);
}

TEST(MultiReply, WhatDoesNotDivideExactlyIsRefusedWhole)
{
    char const* const payloads[] = {
        "",
        "41",
        "7F 01 12",
        "41 0C 17 B8 0D",       // the last value is missing
        "41 0C 17 B8 0D 00 00", // a byte too many, which is no PID that was asked for
        "41 0C 17 0D 00",       // a byte of the first is lost
        "41 0C 17 B8 0C 17 B8", // twice
        "41 05 44",             // not asked for
        "49 0C 17 B8",          // of another service
    };
    for (char const* payload : payloads) {
        EXPECT_FALSE(split(payload, "0C 0D").has_value()) << payload;
    }
    // Of a PID whose length is not known nothing can be told.
    EXPECT_FALSE(split("41 C2 01", "C2").has_value());
}

TEST(MultiLimit, GrowsAsFarAsTheModuleProvesIt)
{
    MultiLimit limit(6);
    EXPECT_EQ(limit.now(), 2U);
    limit.proved(2);
    EXPECT_EQ(limit.now(), 3U);
    limit.proved(3);
    EXPECT_EQ(limit.now(), 6U);
    EXPECT_EQ(MultiLimit(0).now(), 1U);
    EXPECT_EQ(MultiLimit(1).now(), 1U);
    MultiLimit wide(9);
    wide.proved(3);
    EXPECT_EQ(wide.now(), 6U) << "more the standard does not allow";
    EXPECT_EQ(MultiLimit(2).now(), 2U);
}

TEST(MultiLimit, FallsBackToWhatIsProved)
{
    MultiLimit limit(6);
    limit.failed(2);
    EXPECT_EQ(limit.now(), 1U);

    MultiLimit cut(6);
    cut.proved(2);
    cut.failed(3);
    EXPECT_EQ(cut.now(), 2U);
    cut.failed(2); // fails at what it had proved
    EXPECT_EQ(cut.now(), 1U);
}

TEST(MultiLimit, OnlyTheThirdMissInARowCounts)
{
    MultiLimit limit(6);
    limit.proved(2);
    limit.missed(3);
    limit.missed(3);
    EXPECT_EQ(limit.now(), 3U);
    limit.proved(3);
    limit.missed(6);
    limit.missed(6);
    EXPECT_EQ(limit.now(), 6U);
    limit.missed(6);
    EXPECT_EQ(limit.now(), 3U);
    limit.missed(3);
    limit.missed(3);
    EXPECT_EQ(limit.now(), 3U) << "counted anew";
    limit.missed(3);
    EXPECT_EQ(limit.now(), 1U);
}

} // namespace
