#include <obd/connectiondescriptors.h>

#include <gtest/gtest.h>

namespace {

TEST(BluetoothDescriptor, NameIsStrippedOfWhiteSpaceAtBothEndsOnly)
{
    EXPECT_EQ(obd::BluetoothDescriptor(" \t\r\n\v\fOBD II \n", " a ", 1).name(), "OBD II");
    EXPECT_EQ(obd::BluetoothDescriptor(" \t ", "", 1).name(), "");
    EXPECT_EQ(obd::BluetoothDescriptor("", "", 1).name(), "");
    EXPECT_EQ(obd::BluetoothDescriptor("\xC3\xA9 \xA0", "", 1).name(), "\xC3\xA9 \xA0") << "bytes beyond ASCII stay";
    EXPECT_EQ(obd::BluetoothDescriptor("x", " a ", 1).address(), " a ");
}

} // namespace
