// How many replies to wait for, said with the request so that the adapter does not wait for more.

#include "tests/libvelmora/channel/channelrig.h"
#include "tests/libvelmora/channel/timedreplies.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using test::ChannelRig;
using test::saidCounted;
using test::saidPlainly;
using test::speedLine;
using test::speedOfTwo;
using testing::ElementsAre;
using testing::Optional;

void askTwice(ChannelRig& rig, std::string const& request)
{
    rig.ask(request);
    rig.ask(request);
    rig.wire->takeCommands();
}

TEST(CountDigit, FollowsTwoEqualPlainReplies)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedOfTwo)).on("010C2", saidCounted(speedOfTwo));
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "010C", "010C2"));
    EXPECT_TRUE(rig.channel.statistics().countingWorks);
}

TEST(CountDigit, OnlyForServicesOfFixedShapeAndLearntTexts)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("03", saidPlainly("7E8024300")).on("07", saidPlainly("7E8024700")).on("0A", saidPlainly("7E8024A00"));
    rig.wire->on("020C00", saidPlainly("7E805420C001AF8"))
        .on("0600", saidPlainly("7E806460000000000"))
        .on("010C", saidPlainly(speedLine));
    for (char const* request : {"03", "07", "0A", "020C00", "0600"}) {
        askTwice(rig, request);
        rig.ask(request);
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre(request));
    }
    rig.wire->on("010D0C", saidPlainly("7E806410D000C1AF8")).on("010C0D", saidPlainly("7E806410C1AF80D00"));
    askTwice(rig, "010C0D");
    rig.ask("010D0C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010D0C")) << "another order is another request";
}

TEST(CountDigit, NeverOnJ1850Pwm)
{
    ChannelRig pwm;
    pwm.connect();
    pwm.ask("ATTP1");
    pwm.wire->on("010C", saidPlainly("416B10410C1AF8D5"));
    askTwice(pwm, "010C");
    pwm.ask("010C");
    EXPECT_THAT(pwm.wire->takeCommands(), ElementsAre("010C"));
}

TEST(CountDigit, AnUnfinishedReplyIsAskedPlainlyInPlaceAndUnlearnt)
{
    for (char const* bad : {"7E804410C1AF8", "7E804410C1AF8\rCAN ERROR", "7E804410C1AF8\r7E9037F0178", "NO DATA",
                            "7E804410C1AF8\r7EA04410C1AF8", "7E803410D20\r7E904410C1AF8"}) {
        ChannelRig rig;
        rig.connect();
        rig.wire->on("010C", saidPlainly(speedOfTwo)).on("010C2", saidCounted(bad));
        askTwice(rig, "010C");
        EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9")) << bad;
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C2", "010C")) << bad;
        EXPECT_EQ(rig.met(Habit::UnfinishedCount), 1U);
    }
}

TEST(CountDigit, OrphansOfAnUnfinishedReplyAreTakenOffTheNext)
{
    ChannelRig rig;
    rig.connect();
    std::string const message = "7E8101449020156454C\r7E8214D524153314D4D\r7E82230303030303031";
    std::string joined = message;
    std::erase(joined, '\r');
    rig.wire->on("0902", saidPlainly(message)).on("0902", saidPlainly(message));
    rig.wire->on("0902", saidPlainly("7E82230303030303031\r" + message));
    rig.wire->on("09023", saidCounted("7E8101449020156454C\r7E8214D524153314D4D"));
    askTwice(rig, "0902");
    EXPECT_THAT(rig.ask("0902"), Optional(joined));
    EXPECT_EQ(rig.met(Habit::OrphanFrame), 1U);
}

TEST(CountDigit, ThreeFailuresOrARefusalSwitchItOff)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidCounted("NO DATA"));
    rig.ask("010C");
    for (int i = 0; i < 3; ++i) {
        rig.ask("010C"); // with the plain one of the failure the second
        rig.wire->takeCommands();
        rig.ask("010C");
        EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C1", "010C"));
    }
    askTwice(rig, "010C");
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C"));
    EXPECT_TRUE(rig.channel.statistics().countingOff);

    ChannelRig refusing;
    refusing.connect();
    refusing.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidCounted("?"));
    askTwice(refusing, "010C");
    EXPECT_THAT(refusing.ask("010C"), Optional(speedLine));
    EXPECT_TRUE(refusing.channel.statistics().countingOff);
}

TEST(CountDigit, AnAdapterThatGainsNothingByItIsAskedPlainly)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedLine)).on("010C1", saidPlainly(speedLine));
    askTwice(rig, "010C");
    for (int i = 0; i < 3; ++i) {
        rig.ask("010C");
    }
    rig.wire->takeCommands();
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C"));
}

TEST(CountDigit, AModuleThatComesBackIsFound)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedLine)).on("010C", saidPlainly(speedLine)).on("010C", saidPlainly(speedOfTwo));
    rig.wire->on("010C1", saidCounted(speedLine)).on("010C2", saidCounted(speedOfTwo));
    askTwice(rig, "010C");
    rig.ask("010C");
    rig.wire->read(rig.wire->now() + WireTime(31000));
    EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    rig.ask("010C");
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C1", "010C", "010C", "010C2"));
}

TEST(CountDigit, ACommandThatChangesTheAdapterUnlearnsAll)
{
    ChannelRig rig;
    rig.connect();
    rig.wire->on("010C", saidPlainly(speedLine));
    askTwice(rig, "010C");
    rig.ask("ATRV");
    rig.ask("ATCRA7E8");
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATRV", "ATCRA7E8", "010C"));
}

} // namespace

} // namespace velmora
