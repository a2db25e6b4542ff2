#include "libobd/bytes/bytes.h"
#include "tests/support/hexbytes.h"

#include <gtest/gtest.h>

#include <limits>
#include <stdexcept>

namespace {

using support::hexBytes;
using Bytes = std::vector<unsigned char>;

constexpr std::size_t huge = std::numeric_limits<std::size_t>::max();

Bytes copied(obd::ByteView view)
{
    return {view.begin(), view.end()};
}

TEST(CheckedBytes, SliceGivesWhatLiesInside)
{
    Bytes const data = hexBytes("01 02 03");
    EXPECT_EQ(copied(obd::slice(data, 0, 3)), data);
    EXPECT_EQ(copied(obd::slice(data, 1, 1)), hexBytes("02"));
    EXPECT_EQ(copied(obd::slice(data, 3, 0)), Bytes());
}

TEST(CheckedBytes, SliceThrowsPastTheEnd)
{
    Bytes const data = hexBytes("01 02 03");
    EXPECT_THROW(obd::slice(data, 0, 4), std::out_of_range);
    EXPECT_THROW(obd::slice(data, 3, 1), std::out_of_range);
    EXPECT_THROW(obd::slice(data, 4, 0), std::out_of_range);
    EXPECT_THROW(obd::slice(data, 1, huge), std::out_of_range);
    EXPECT_THROW(obd::slice(data, huge, 1), std::out_of_range);
}

TEST(CheckedBytes, ByteAtThrowsPastTheEnd)
{
    Bytes const data = hexBytes("01 02");
    EXPECT_EQ(obd::byteAt(data, 1), 0x02);
    EXPECT_THROW(obd::byteAt(data, 2), std::out_of_range);
    EXPECT_THROW(obd::byteAt({}, 0), std::out_of_range);
}

TEST(CheckedBytes, CopyIntoOverwritesInPlace)
{
    Bytes target = hexBytes("00 00 00 00");
    obd::copyInto(target, 1, hexBytes("0A 0B"));
    EXPECT_EQ(target, hexBytes("00 0A 0B 00"));
    obd::copyInto(target, 4, {});
    EXPECT_EQ(target.size(), 4U);
}

TEST(CheckedBytes, CopyIntoThrowsPastTheEndAndLeavesTheTarget)
{
    Bytes target = hexBytes("00 00");
    EXPECT_THROW(obd::copyInto(target, 1, hexBytes("0A 0B")), std::out_of_range);
    EXPECT_THROW(obd::copyInto(target, 3, {}), std::out_of_range);
    EXPECT_THROW(obd::copyInto(target, huge, hexBytes("0A")), std::out_of_range);
    EXPECT_EQ(target, hexBytes("00 00"));
}

} // namespace
