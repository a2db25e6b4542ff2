#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleasker.h"
#include "libvelmora/uds/refusalcode.h"
#include "libvelmora/uds/requeststate.h"
#include "libvelmora/uds/udscodes.h"
#include "tests/support/modulebench.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <map>

namespace velmora {

namespace {

using std::chrono::milliseconds;
using std::chrono::seconds;
using support::ModuleBench;
using testing::ElementsAre;
using testing::IsEmpty;

using AnswerKind = ModuleAnswer::Kind;

RequestAddress moduleAt(std::string const& header, std::string const& reply = {}, std::optional<unsigned char> ext = {})
{
    return addressOf(header, reply, ext, obd::ObdProtocolCan11).address.value();
}

TEST(ReadingOnly, KnowsWhatEachPurposeMaySend)
{
    struct Row
    {
        RequestPurpose purpose;
        std::vector<unsigned char> request;
        char const* refusal; // null: it may be sent; else a part of the reason
    };
    Row const rows[] = {
        {RequestPurpose::Signal, {0x01, 0x0C}, nullptr},
        {RequestPurpose::Signal, {0x02, 0x0C, 0x00}, nullptr},
        {RequestPurpose::Signal, {0x05, 0x01, 0x01}, nullptr},
        {RequestPurpose::Signal, {0x06, 0x01}, nullptr},
        {RequestPurpose::Signal, {0x09, 0x02}, nullptr},
        {RequestPurpose::Signal, {0x1A, 0x90}, nullptr},
        {RequestPurpose::Signal, {0x21, 0x01}, nullptr},
        {RequestPurpose::Signal, {0x22, 0xF1, 0x90}, nullptr},
        {RequestPurpose::Signal, {0x22, 0xF1, 0x90, 0xF1, 0x87}, nullptr},
        {RequestPurpose::Signal, {0x22, 0xF1, 0x90, 0xF1, 0x87, 0xF1, 0x88}, nullptr},
        {RequestPurpose::Signal, {0x22, 0xF1}, "wants 3 bytes"},
        {RequestPurpose::Signal, {0x22, 0xF1, 0x90, 0xF1}, "wants 3 bytes"},
        {RequestPurpose::Signal, {}, "empty"},
        {RequestPurpose::Signal, {0x22, 1, 2, 3, 4, 5, 6, 7, 8}, "7 bytes at most"},
        {RequestPurpose::Signal, {0x10, 0x01}, "changes the session"},
        {RequestPurpose::Signal, {0x10, 0x03}, "changes the session"},
        {RequestPurpose::Signal, {0x23, 0x00}, "memory by address"},
        {RequestPurpose::Signal, {0x2A, 0x01}, "by itself"},
        {RequestPurpose::Signal, {0x2C, 0x01}, "changes definitions"},
        {RequestPurpose::Signal, {0x2E, 0xF1, 0x90}, "writes"},
        {RequestPurpose::Signal, {0x2F, 0x01}, "moves"},
        {RequestPurpose::Signal, {0x31, 0x01}, "routine"},
        {RequestPurpose::Signal, {0x34, 0x00}, "loads data"},
        {RequestPurpose::Signal, {0x36, 0x00}, "programming"},
        {RequestPurpose::Signal, {0x37}, "programming"},
        {RequestPurpose::Signal, {0x3B, 0x90}, "writes"},
        {RequestPurpose::Signal, {0x3D, 0x00}, "writes memory"},
        {RequestPurpose::Signal, {0x85, 0x02}, "storing trouble codes"},
        {RequestPurpose::Signal, {0x86, 0x00}, "by itself"},
        {RequestPurpose::Signal, {0xAA, 0x00}, "by itself"},
        {RequestPurpose::Signal, {0x04}, "clears"},
        {RequestPurpose::Signal, {0x77, 0x00}, "none of those"},
        {RequestPurpose::Signal, {0x19, 0x02, 0x8D}, "velmora codes"},
        {RequestPurpose::Signal, {0x3E, 0x00}, "session open"},
        {RequestPurpose::Codes, {0x19, 0x02, 0x8D}, nullptr},
        {RequestPurpose::Codes, {0x18, 0x00, 0xFF, 0x00}, nullptr},
        {RequestPurpose::Codes, {0x03}, nullptr},
        {RequestPurpose::Codes, {0x19, 0x0A}, nullptr},
        {RequestPurpose::Codes, {0x19, 0x05, 0x00}, "no such report"},
        {RequestPurpose::Codes, {0x19}, "no such report"},
        {RequestPurpose::Codes, {0x14, 0xFF, 0xFF, 0xFF}, "clears"},
        {RequestPurpose::Codes, {0x22, 0xF1, 0x90}, "service 22"},
        {RequestPurpose::Presence, {0x3E, 0x00}, nullptr},
        {RequestPurpose::Presence, {0x3E, 0x80}, nullptr},
        {RequestPurpose::Presence, {0x3E, 0x01}, nullptr},
        {RequestPurpose::Presence, {0x3E, 0x02}, nullptr},
        {RequestPurpose::Presence, {0x3E, 0x05}, "3E"},
        {RequestPurpose::Presence, {0x10, 0x03}, "changes the session"},
    };
    for (Row const& row : rows) {
        std::optional<std::string> const refusal = refusalFor(row.request, row.purpose);
        if (row.refusal == nullptr) {
            EXPECT_EQ(refusal, std::nullopt);
        } else {
            EXPECT_THAT(refusal.value_or("may be sent"), testing::HasSubstr(row.refusal));
        }
    }
}

TEST(ModuleAsker, CountsOnlyAnAnswerThatRepeatsServiceAndIdentifier)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7B3", "222801", {"7BB0462280201"});                // of the request before
    bench.module("7B3", "222802", {"7BB037F2131", "7BB0462280205"}); // and of another service
    bench.module("7B3", "222803", {"7BB037F2231"});
    bench.module("7B3", "222804", {"CAN ERROR"});
    bench.module("7B3", "222805", {"7BB100A622805112233", "7BB2144556677000000"});
    EXPECT_EQ(asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x01}).kind, AnswerKind::Foreign);
    ModuleAnswer const right = asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x02});
    EXPECT_EQ(right.kind, AnswerKind::Positive);
    EXPECT_EQ(right.module, 0x7BBU);
    EXPECT_THAT(right.payload, ElementsAre(0x62, 0x28, 0x02, 0x05));
    ModuleAnswer const refused = asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x03});
    EXPECT_EQ(refused.kind, AnswerKind::Refused);
    EXPECT_EQ(refused.code, 0x31);
    EXPECT_EQ(describe(refused), "is refused: Request Out of Range");
    EXPECT_EQ(asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x04}).kind, AnswerKind::BusTrouble);
    EXPECT_THAT(asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x05}).payload,
                ElementsAre(0x62, 0x28, 0x05, 0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77));
    EXPECT_EQ(asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x06}).kind, AnswerKind::Silent);
    bench.takeAsked();
    EXPECT_EQ(asker.ask(moduleAt("7B3", "7BB"), {0x2E, 0x28, 0x01, 0x00}).kind, AnswerKind::NotSent);
    EXPECT_THAT(bench.takeAsked(), IsEmpty()) << "nothing goes out";
    bench.refuseAddress("ATFCSM1");
    EXPECT_EQ(describe(asker.ask(moduleAt("7B3", "7BB"), {0x22, 0x28, 0x02})),
              "can't be asked by this adapter, which does not know ATFCSM1");
}

TEST(ModuleAsker, WaitsLongestForAModuleThatAskedForTime)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7E4", "220106", {"7EC037F2278"}).module("7E4", "220106", {"7EC05620106038F"});
    EXPECT_EQ(asker.ask(moduleAt("7E4"), {0x22, 0x01, 0x06}).kind, AnswerKind::Positive);
    ASSERT_EQ(bench.addresses().size(), 2U);
    EXPECT_TRUE(bench.addresses()[0].adaptive);
    EXPECT_FALSE(bench.addresses()[1].adaptive) << "ATAT0";
    EXPECT_EQ(bench.addresses()[1].waitMs, 1044U) << "ATST FF";
    asker.ask(moduleAt("7E4"), {0x22, 0x01, 0x06});
    EXPECT_EQ(bench.addresses().back().waitMs, 1044U) << "from then on";
    ModuleBench silent;
    ModuleAsker other(silent, silent);
    silent.module("7E4", "220106", {"7EC037F2278"});
    ModuleAnswer const answer = other.ask(moduleAt("7E4"), {0x22, 0x01, 0x06});
    EXPECT_EQ(describe(answer), "asks for time and then does not answer");
    EXPECT_EQ(silent.takeAsked().size(), 2U) << "once more, and no more";
}

TEST(ModuleAsker, TriesAModulesOwnAddressByteWhereTheTestersIsSilent)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("750", "2130", {}).module("750", "2130", {"758066130999A9D9C"});
    RequestAddress const tires = moduleAt("750", "758", 0x2A);
    EXPECT_EQ(tires.flowData, "2A300000");
    EXPECT_FALSE(tires.adaptive);
    EXPECT_EQ(asker.ask(tires, {0x21, 0x30}).kind, AnswerKind::Positive);
    EXPECT_EQ(bench.addresses()[0].tester, "F1");
    EXPECT_EQ(bench.addresses()[1].tester, "2A");
    asker.ask(tires, {0x21, 0x30});
    EXPECT_EQ(bench.addresses()[2].tester, "2A") << "it is remembered";
}

TEST(ModuleAddress, FollowsFromTheIdentifiers)
{
    EXPECT_EQ(moduleAt("7E4").reply, "7EC");
    EXPECT_EQ(moduleAt("7E4").flowHeader, "") << "the adapter does it itself";
    EXPECT_EQ(moduleAt("743", "763").flowHeader, "743");
    auto const longOne = addressOf("DA10F1", {}, {}, obd::ObdProtocolCan29).address.value();
    EXPECT_EQ(longOne.header, "18DA10F1");
    EXPECT_EQ(longOne.reply, "18DAF110");
    EXPECT_EQ(addressOf("17FC007B", "17FE007B", {}, obd::ObdProtocolCan29).address.value().flowHeader, "17FC007B");
    EXPECT_EQ(addressOf("7E0", {}, {}, obd::ObdProtocolCan29).reason,
              "the header 7E0 is none of this bus, whose identifiers have 8 digits");
    EXPECT_EQ(addressOf("7B3", {}, {}, obd::ObdProtocolCan11).reason, "the identifier of its reply is not told");
    EXPECT_EQ(standardRequest(0x7EA, obd::ObdProtocolCan11), "7E2");
    EXPECT_EQ(standardRequest(0x18DAF110, obd::ObdProtocolCan29), "18DA10F1");
    EXPECT_EQ(standardRequest(0x763, obd::ObdProtocolCan11), std::nullopt);
    EXPECT_EQ(standardRequest(0x10, obd::ObdProtocolJ1850), std::nullopt) << "PWM and VPW write it differently";
}

ModuleAnswer refusedBy(unsigned char code)
{
    ModuleAnswer answer;
    answer.kind = AnswerKind::Refused;
    answer.code = code;
    return answer;
}

// One letter for each code from 00 on, 16 a line: . after three, a absent, s session, l locked, L later, S soon, d
// divided, w waits.
TEST(RefusalCode, EachHasItsStanding)
{
    std::string const standings = "................" // 00
                                  ".aaad..........."
                                  ".SL.LLL........."
                                  ".a.llllllll....." // 30
                                  "................"
                                  "llllllllllllll.."
                                  "................" // 60
                                  "........w.....ss"
                                  ".LLLLLLLLLLLLLLL"
                                  "LLLLL..........." // 90
                                  "................"
                                  "................"
                                  "................" // C0
                                  "................"
                                  "................"
                                  "LLLLLLLLLLLLLLL."; // F0
    std::map<RefusalAction, char> const letters = {
        {RefusalAction::StopAbsent, 'a'}, {RefusalAction::StopLocked, 'l'},    {RefusalAction::StopSession, 's'},
        {RefusalAction::RetryLater, 'L'}, {RefusalAction::RetrySoon, 'S'},     {RefusalAction::Wait, 'w'},
        {RefusalAction::Split, 'd'},      {RefusalAction::StopAfterThree, '.'}};
    ASSERT_EQ(standings.size(), 256U);
    for (unsigned int code = 0; code < 256; ++code) {
        EXPECT_EQ(letters.at(refusalAction(static_cast<unsigned char>(code))), standings[code]) << std::hex << code;
    }
}

TEST(RequestState, DoesWithEachRefusalWhatItMeans)
{
    RequestState::Time const now{seconds(1000)};
    for (int code : {0x11, 0x12, 0x13, 0x31, 0x33, 0x3A, 0x50, 0x5D, 0x7E, 0x7F}) {
        RequestState state;
        state.take(refusedBy(static_cast<unsigned char>(code)), now);
        EXPECT_TRUE(state.ended()) << code;
        EXPECT_FALSE(state.isDue(now + std::chrono::hours(1))) << code;
    }
    for (int code : {0x22, 0x24, 0x26, 0x81, 0x94, 0xF0, 0xFE, 0x78}) {
        RequestState state;
        state.take(refusedBy(static_cast<unsigned char>(code)), now);
        EXPECT_FALSE(state.isDue(now + milliseconds(29999))) << code;
        EXPECT_TRUE(state.isDue(now + seconds(30))) << code;
    }
    for (int code : {0x10, 0x3B, 0x40, 0x70, 0x80, 0x95, 0xFF}) {
        RequestState state;
        state.take(refusedBy(static_cast<unsigned char>(code)), now);
        state.take(refusedBy(static_cast<unsigned char>(code)), now);
        EXPECT_TRUE(state.isDue(now)) << code;
        state.take(refusedBy(static_cast<unsigned char>(code)), now);
        EXPECT_TRUE(state.ended()) << code;
    }
    RequestState busy;
    for (int i = 0; i < 3; ++i) {
        busy.take(refusedBy(0x21), now);
        EXPECT_FALSE(busy.isDue(now + milliseconds(199)));
        EXPECT_TRUE(busy.isDue(now + milliseconds(200)));
    }
    busy.take(refusedBy(0x21), now);
    EXPECT_FALSE(busy.isDue(now + seconds(29)));
    ModuleAnswer answered;
    answered.kind = AnswerKind::Positive;
    busy.take(answered, now);
    for (int i = 0; i < 3; ++i) {
        busy.take(refusedBy(0x21), now);
        EXPECT_TRUE(busy.isDue(now + milliseconds(200))) << "an answer begins the count anew";
    }
    RequestState split;
    split.take(refusedBy(0x14), now);
    EXPECT_TRUE(split.wantsSplit());
    RequestState silent;
    for (int i = 0; i < 3; ++i) {
        EXPECT_TRUE(silent.isDue(now));
        silent.take(ModuleAnswer(), now);
    }
    EXPECT_FALSE(silent.isDue(now + seconds(29)));
    ModuleAnswer good;
    good.kind = AnswerKind::Positive;
    silent.take(good, now);
    EXPECT_TRUE(silent.isDue(now)) << "an answer forgives all";
    EXPECT_EQ(silent.reason(), "");
}

TEST(UdsCodes, AreReadWithFormatStatusAndCount)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7E4", "19018D", {"7EC065901FF000002"});
    bench.module("7E4", "19028D", {"7EC100B5902FF0A1B00", "7EC212F0AA61C0800"});
    UdsCodeReport const report = readUdsCodes(asker, moduleAt("7E4"));
    EXPECT_EQ(report.answer, TopicAnswer::Read);
    EXPECT_TRUE(isStandardFormat(report));
    EXPECT_EQ(report.count, 2U);
    ASSERT_EQ(report.codes.size(), 2U);
    EXPECT_EQ(report.available, 0xFF);
    EXPECT_EQ(report.format, 0);
    EXPECT_EQ(report.codes[0].status, 0x2F);
    EXPECT_EQ(report.codes[1].status, 0x08);
    EXPECT_EQ(report.codes[0].code(), "P0A1B");
    EXPECT_EQ(report.codes[1].hex(), "0AA61C");
    EXPECT_EQ(report.codes[1].failureType(), 0x1C);
    EXPECT_THAT(statusWords(0x2F, 0xFF), ElementsAre("present", "confirmed"));
    EXPECT_THAT(statusWords(0x08, 0xFF), ElementsAre("confirmed", "stored"));
    EXPECT_THAT(statusWords(0x08, 0x08), ElementsAre("confirmed")) << "the module does not tell what is now";
    EXPECT_THAT(statusWords(0x84, 0xFF), ElementsAre("pending", "lamp"));
    EXPECT_THAT(statusWords(0xFF, 0x00), IsEmpty());
    bench.module("7E5", "19018D", {"7ED065901FF040203"}).module("7E5", "19028D", {"7ED035902FF"});
    UdsCodeReport const none = readUdsCodes(asker, moduleAt("7E5"));
    EXPECT_EQ(none.format, 0x04);
    EXPECT_TRUE(isStandardFormat(none));
    EXPECT_EQ(none.count, 0x0203U);
    EXPECT_TRUE(none.codes.empty());
    EXPECT_EQ(none.answer, TopicAnswer::Read);
    bench.module("7E6", "19018D", {"7EE065901FF010000"}).module("7E6", "19028D", {"7EE025902"});
    EXPECT_FALSE(isStandardFormat(readUdsCodes(asker, moduleAt("7E6"))));
    EXPECT_EQ(readUdsCodes(asker, moduleAt("7E6")).answer, TopicAnswer::Unreadable);
    bench.module("7E1", "19028D", {"7E9037F1911"});
    UdsCodeReport const refused = readUdsCodes(asker, moduleAt("7E1"));
    EXPECT_EQ(refused.answer, TopicAnswer::Refused);
    EXPECT_EQ(refused.format, std::nullopt);
    EXPECT_EQ(refused.refusal, 0x11);
    EXPECT_EQ(readUdsCodes(asker, moduleAt("7E2")).answer, TopicAnswer::Silent);
    bench.module("7E3", "19028D", {"7EB055902FF0A1B"}); // a code that is cut
    EXPECT_EQ(readUdsCodes(asker, moduleAt("7E3")).answer, TopicAnswer::Unreadable);
}

} // namespace

} // namespace velmora
