// What the channel does to save time: counts, masks from memory, the bus of the last visit, a shorter wait.

#include "libvelmora/channel/learntstore.h"
#include "tests/libvelmora/channel/channelrig.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::Optional;
using Pieces = support::ScriptedWire::Reply;

std::string const speedLine = "7E804410C1AF8";
std::string const speedOfTwo = "7E804410C1AF8\r7E904410C1AF9";

// What an adapter that waits says plainly, and with a count.
Pieces saidPlainly(std::string const& lines)
{
    return {{lines + "\r"}, {"\r>", WireTime(80)}};
}
Pieces saidCounted(std::string const& lines)
{
    return {{lines + "\r\r>"}};
}

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

// An adapter that ignores its adaptive timing: 400 ms behind each reply, or what ATST tells.
Pieces saidSlowly(std::string const& lines, int waitMs)
{
    return {{lines + "\r", WireTime(20)}, {"\r>", WireTime(waitMs)}};
}

TEST(ShortWait, FollowsALongOneAndIsGivenBackForASilentModule)
{
    ChannelRig rig;
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 400));
    rig.bringUp();
    rig.wire->takeCommands();
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST19"));
    EXPECT_EQ(rig.channel.statistics().waitMs, 102U);
    rig.wire->on("010C", saidSlowly(speedLine, 102))
        .on("010C", saidSlowly(speedOfTwo, 400))
        .on("010C", saidSlowly(speedLine, 102));
    EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", "ATST64", "010C", "ATST19"));
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C")) << "once a request";
    rig.ask("ATLP", 10);
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATST64"));
}

TEST(ShortWait, IsNotForKLines)
{
    ChannelRig kLine;
    kLine.wire->on("0100", saidSlowly("86F1114100BE3EB81134", 400));
    kLine.bringUp();
    kLine.ask("ATTP5");
    kLine.wire->takeCommands();
    kLine.ask("0100");
    EXPECT_THAT(kLine.wire->takeCommands(), ElementsAre("0100"));
}

// An adapter that adapts its wait behind replies still gives silence all of ATST.
TEST(ShortWait, OfAnAdapterThatAdaptsItselfIsForTheBringUpOnly)
{
    ChannelRig rig;
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 60)).on("0800", "NO DATA");
    rig.wire->on("0101", "NO DATA").on("0120", saidSlowly("7E8064120A007F011", 60));
    rig.bringUp();
    rig.wire->takeCommands();
    for (char const* request : {"0100", "0800", "0120"}) {
        rig.ask(request);
    }
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST19", "0800", "0120"));
    rig.ask("0101");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0101", "ATST64", "0101", "ATST19"))
        << "no mask: the full wait once";
    rig.channel.onConnected();
    rig.ask("0800");
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("ATST64", "0800", "0100"));
    EXPECT_EQ(rig.channel.statistics().waitMs, 102U) << "what was done is told all the same";
}

TEST(ShortWait, IsNeverUnderTwiceTheSlowestReply)
{
    ChannelRig rig;
    rig.wire->on("0100", Pieces{{"7E8064100BE3EA813\r", WireTime(90)}, {"\r>", WireTime(400)}});
    rig.bringUp();
    rig.wire->takeCommands();
    rig.ask("0100");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("0100", "ATST2C")); // 180 ms
}

// Agrees to ATST19 and waits 400 ms all the same.
void bringUpStubborn(ChannelRig& rig)
{
    rig.wire->on("0100", saidSlowly("7E8064100BE3EA813\r7E906410080000001", 400));
    rig.wire->on("0120", saidSlowly("7E8064120A007F011\r7E906412080000001", 400));
    rig.wire->on("0140", saidSlowly("7E8064140A007F011\r7E906414080000001", 400));
    rig.wire->on("010D", saidSlowly("7E803410D20", 400)).on("03", saidSlowly("7E8024300\r7E9024300", 400));
    rig.wire->on("04", saidSlowly("7E80144\r7E90144", 400)).on("010C", saidSlowly(speedOfTwo, 400));
    rig.wire->on("010C2", saidCounted(speedOfTwo));
    rig.bringUp();
    for (char const* request : {"0100", "0120", "0140"}) {
        rig.ask(request);
    }
    EXPECT_THAT(rig.wire->takeCommands(), testing::Not(testing::Contains(" "))) << "seen twice first";
}

TEST(StubbornWait, IsEndedByABlankOnceAllModulesHaveSpoken)
{
    ChannelRig rig;
    rig.wire->onInterrupt({{"STOPPED\r\r>", WireTime(4)}});
    bringUpStubborn(rig);
    WireTime const before = rig.wire->now();
    EXPECT_THAT(rig.ask("03"), Optional(std::string("7E80243007E9024300")));
    EXPECT_LE(rig.wire->now() - before, WireTime(20 + 103 + 4));
    EXPECT_GE(rig.wire->now() - before, WireTime(20 + 102)) << "not under what adapters have by default";
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("03", " "));
    rig.ask("010D");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010D")) << "a module is missing: it had the full wait";
    rig.ask("04");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("04")) << "nothing that changes the vehicle";
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(rig.ask("010C"), Optional(speedLine + "7E904410C1AF9"));
    }
    rig.channel.onConnected();
    rig.ask("010C");
    EXPECT_THAT(rig.wire->takeCommands(), ElementsAre("010C", " ", "010C", " ", "010C", " ", "010C2"))
        << "a reply that was cut teaches its count like any other";
    EXPECT_EQ(rig.channel.statistics().waitsCut, 4U);
    EXPECT_EQ(rig.met(Habit::TrailingError), 0U);
}

TEST(StubbornWait, OfAnAdapterThatIsNotInterruptedIsWaitedOut)
{
    ChannelRig deaf;
    bringUpStubborn(deaf);
    for (int i = 0; i < 3; ++i) {
        EXPECT_THAT(deaf.ask("03"), Optional(std::string("7E80243007E9024300")));
    }
    EXPECT_THAT(deaf.wire->takeCommands(), ElementsAre("03", " ", "03", " ", "03"));

    ChannelRig breaking; // what it says behind the interruption is no whole reply
    breaking.wire->onInterrupt({{"7EA1009490\rSTOPPED\r\r>", WireTime(4)}});
    bringUpStubborn(breaking);
    EXPECT_THAT(breaking.ask("03"), Optional(std::string("7E80243007E9024300")));
    breaking.ask("03");
    EXPECT_THAT(breaking.wire->takeCommands(), ElementsAre("03", " ", "03", "03")) << "asked again, and left in peace";

    ChannelRig starting;
    starting.wire->onInterrupt({{"ELM327 v1.5\r\r>", WireTime(4)}});
    bringUpStubborn(starting);
    EXPECT_THAT(starting.ask("03", 5000), Optional(std::string("7E80243007E9024300")));
    starting.wire->takeCommands();
    for (int i = 0; i < 4; ++i) {
        starting.ask("03");
    }
    EXPECT_THAT(starting.wire->takeCommands(), testing::Not(testing::Contains(" "))) << "it is not provoked again";
    EXPECT_TRUE(starting.channel.isValid());
}

TEST(StubbornWait, IsLeftAloneWhereTheWaitMustNotBeShortened)
{
    ChannelRig recording(nullptr, {.port = {}, .shortWait = false});
    bringUpStubborn(recording);
    recording.ask("03");
    EXPECT_THAT(recording.wire->takeCommands(), ElementsAre("03"));

    ChannelRig kLine;
    kLine.wire->on("0100", saidSlowly("86F1114100BE3EB81134", 400)).on("03", saidSlowly("82F1114300C7", 400));
    kLine.bringUp();
    kLine.ask("ATTP5");
    for (int i = 0; i < 4; ++i) {
        kLine.ask("03");
    }
    EXPECT_THAT(kLine.wire->takeCommands(), testing::Not(testing::Contains(" ")));
}

} // namespace

} // namespace velmora
