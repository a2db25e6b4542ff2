#include "libvelmora/record/macmask.h"

#include <gtest/gtest.h>

namespace {

using velmora::withoutMacs;

TEST(MacMask, KeepsTheMakersHalfAlone)
{
    EXPECT_EQ(withoutMacs("ok     port       bt://00:1D:A5:68:98:8B\n"), "ok     port       bt://00:1D:A5:xx:xx:xx\n");
    EXPECT_EQ(withoutMacs("00:1d:a5:68:98:8b"), "00:1d:a5:xx:xx:xx");
    EXPECT_EQ(withoutMacs("/org/bluez/hci0/dev_AA_BB_CC_DD_EE_FF, AA-BB-CC-DD-EE-FF"),
              "/org/bluez/hci0/dev_AA_BB_CC_xx_xx_xx, AA-BB-CC-xx-xx-xx");
    EXPECT_EQ(withoutMacs("00:1D:A5:68:98:8B00:1D:A5:68:98:8B"), "00:1D:A5:xx:xx:xx00:1D:A5:xx:xx:xx");
}

TEST(MacMask, KnowsItsDigits)
{
    for (char const* const known : {"09:AF:af:00:00:00", "99:FF:ff:90:09:Fa"}) {
        std::string const text = known;
        EXPECT_EQ(withoutMacs(text), text.substr(0, 9) + "xx:xx:xx") << text;
        for (char const odd : {'/', '@', 'G', '`', 'g', ' '}) {
            for (std::size_t at = 0; at < text.size(); ++at) {
                std::string other = text;
                other[at] = odd;
                EXPECT_EQ(withoutMacs(other), other);
            }
        }
    }
}

TEST(MacMask, LeavesAllElse)
{
    for (char const* const text : {"", "00:1D:A5:68:98", "00:1D:A5:68:98:8", "00:1D-A5:68:98:8B", "12:34:56",
                                   "0: 49 02 01 31 44\r1: 34 47 50 30", "7E8 06 41 00 BE 3F A8 13"}) {
        EXPECT_EQ(withoutMacs(text), text);
    }
}

} // namespace
