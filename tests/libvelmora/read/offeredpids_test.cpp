#include "libvelmora/read/offeredpids.h"
#include "tests/support/fakeproxy.h"

#include <gtest/gtest.h>

namespace {

using support::FakeProxy;
using velmora::OfferedPids;
using Pids = std::vector<unsigned char>;

TEST(OfferedPids, AreTakenFromTheMasksOfEachModule)
{
    FakeProxy proxy;
    proxy.answer("01 80", {{0x7E8, "41 80 80 00 00 03"}, {0x7E9, "41 80 04 00 00 00"}});
    proxy.answer("01 A0", {{0x7E8, "41 A0 04 00 00 01"}, {0x7E9, "7F 01 12"}});
    proxy.answer("01 C0", "41 C0 40 00 00 00");
    OfferedPids const offered(proxy);
    EXPECT_EQ(offered.of(0x7E8), Pids({0x81, 0x9F, 0xA6, 0xC2}));
    EXPECT_EQ(offered.of(0x7E9), Pids({0x86}));
    EXPECT_TRUE(offered.of(0x7EA).empty());
    EXPECT_EQ(proxy.count("01 E0"), 0) << "nobody says that there is more";
}

TEST(OfferedPids, TakeNothingFromWhatIsNoMask)
{
    for (char const* reply : {"41 80 FF FF FF", "41 A0 FF FF FF FF", "7F 01 12", "42 80 FF FF FF FF"}) {
        FakeProxy proxy;
        proxy.answer("01 80", reply);
        EXPECT_TRUE(OfferedPids(proxy).of(0x7E8).empty()) << reply;
        EXPECT_EQ(proxy.count("01 A0"), 0) << reply;
    }
    FakeProxy silent;
    EXPECT_TRUE(OfferedPids(silent).of(0x7E8).empty());
}

} // namespace
