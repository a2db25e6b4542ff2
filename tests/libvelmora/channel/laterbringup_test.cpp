// What a visit knows of an earlier one, and of itself: masks from memory, the bus, counts.

#include "libvelmora/channel/learntstore.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

using test::ChannelRig;
using test::saidCounted;
using test::saidPlainly;
using test::speedLine;
using testing::ElementsAre;

TEST(BringUp, MasksThatWereAskedAreAnsweredFromMemoryUntilTheSessionStands)
{
    ChannelRig rig;
    rig.wire->on("0100", "7E8064100BE3EA813\r7E906410080000001");
    rig.wire->on("0120", "7E8064120A007F011"); // one module of two
    rig.wire->on("0900", "7E806490014400000\r7E906490014400000");
    rig.wire->on("0101", "7E806410100000000\r7E906410100000000");
    rig.bringUp();
    rig.wire->takeCommands();
    for (char const* request : {"0100", "0900", "0120", "0101", "0100", "0900", "0120", "0101"}) {
        EXPECT_NE(rig.ask(request), std::nullopt);
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST19", "0900", "0120", "0101", "0120", "0101"))
        << "a reply without a module, or that is no mask, is not remembered";
    EXPECT_EQ(rig.channel.statistics().fromMemory, 2U);
    rig.channel.onConnected();
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATST64", "0100"));
}

TEST(BringUp, TheBusOfTheLastVisitIsTriedFirstAndASearchFollowsIfItIsNot)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.path() / "learnt.toml";
    {
        ChannelRig first(std::make_shared<LearntStore>(file), {.port = "/dev/ttyUSB0"});
        first.connect();
    }
    ChannelRig second(std::make_shared<LearntStore>(file), {.port = "/dev/ttyUSB0"});
    second.bringUp();
    EXPECT_THAT(second.wire->takeCommands(),
                ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6", "0100", "ATDPN", "ATH1"));

    ChannelRig otherCar(std::make_shared<LearntStore>(file), {.port = "/dev/ttyUSB0"});
    otherCar.wire->on("0100", "CAN ERROR").on("0100", "SEARCHING...\r4100BE3EA813");
    otherCar.bringUp();
    EXPECT_THAT(otherCar.wire->takeCommands(), ElementsAre("ATI", "ATE0", "ATL0", "ATS0", "ATST64", "ATTP6", "0100",
                                                           "ATTP0", "0100", "ATDPN", "ATH1"));

    ChannelRig elsewhere(std::make_shared<LearntStore>(file), {.port = "/dev/ttyUSB1"});
    elsewhere.wire->on("ATI", "ELM327 v1.5");
    elsewhere.ask("ATI");
    elsewhere.ask("ATTP0");
    EXPECT_THAT(elsewhere.wire->takeCommands(), ElementsAre("ATI", "ATTP0"));

    LearntStore(file).forget();
    EXPECT_FALSE(std::filesystem::exists(file));
}

TEST(BringUp, CountsOfAVehicleHoldOnceItsNumberIsRead)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.path() / "learnt.toml";
    for (bool const second : {false, true}) {
        ChannelRig rig(std::make_shared<LearntStore>(file));
        rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidCounted(speedLine));
        rig.wire->on("0902", saidPlainly("7E8101449020156454C\r7E8214D524153314D4D\r7E82230303030303031"));
        rig.connect();
        rig.ask("0902");
        rig.wire->takeCommands();
        rig.ask("010C");
        rig.ask("010C");
        std::string const expected = second ? "010C1" : "010C";
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre(expected, expected));
    }
}

TEST(BringUp, CountsAreNotKeptForANumberThatIsNone)
{
    testsupport::TemporaryFolder const folder;
    for (int visit = 0; visit < 2; ++visit) {
        ChannelRig rig(std::make_shared<LearntStore>(folder.path() / "learnt.toml"));
        rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidCounted(speedLine));
        rig.wire->on("0902", saidPlainly("7E8101449020156454C\r7E8214D524153314D4D\r7E8223030303030302D")); // a dash
        rig.connect();
        rig.ask("0902");
        rig.wire->takeCommands();
        rig.ask("010C");
        rig.ask("010C");
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "010C"));
    }
}

TEST(BringUp, AFileThatIsNoneIsAsNone)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.path() / "learnt.toml";
    for (char const* text :
         {"", "[adapter", "adapter = 5\nvehicle = [1]", "[adapter.x]\nprotocol = 77\n[vehicle.y]\n010C = 'z'",
          "[adapter.x]\nprotocol = 'a'\ncounts = 3\n[vehicle.y]\n010C = 7"}) {
        std::ofstream(file) << text;
        LearntStore const store(file);
        EXPECT_EQ(store.protocol("x"), 0) << text;
        EXPECT_TRUE(store.canCount("x"));
        EXPECT_TRUE(store.counts("y").empty());
    }
    LearntStore nowhere("/proc/none/learnt.toml");
    nowhere.setProtocol("x", 6);
    nowhere.save();
}

} // namespace

} // namespace velmora
