// What answers of modules are, and what long runs of requests heed.
#include "libvelmora/uds/combinedreply.h"
#include "libvelmora/uds/failuretype.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/refusalcode.h"
#include "libvelmora/uds/replyframes.h"
#include "libvelmora/uds/requeststate.h"
#include "libvelmora/uds/standingguard.h"
#include "libvelmora/uds/vehiclevin.h"
#include "tests/support/modulebench.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

namespace velmora {

namespace {

using support::ModuleBench;
using testing::ElementsAre;
using ReplyKind = ModuleAnswer::Kind;

RequestAddress canModule(std::string const& header, std::string const& reply = {},
                         std::optional<unsigned char> ext = {})
{
    return addressOf(header, reply, ext, obd::ObdProtocolCan11).address.value();
}

TEST(ModuleAnswers, OfAModuleWithAnAddressByteAreLookedForUnderBothTesters)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    RequestAddress const plain = canModule("7E0");
    EXPECT_EQ(asker.ask(plain, {0x22, 1, 2}).kind, ReplyKind::Silent);
    EXPECT_EQ(bench.takeAsked().size(), 1U) << "a module without one is asked once";
    RequestAddress const tires = canModule("750", "758", 0x2A);
    bench.module("750", "2130", {"758066130999A9D9C"});
    ModuleAnswer const good = asker.ask(tires, {0x21, 0x30});
    EXPECT_EQ(good.kind, ReplyKind::Positive);
    EXPECT_EQ(good.code, 0) << "which is of refusals";
    EXPECT_EQ(bench.takeAsked().size(), 1U) << "it answers at once";
    EXPECT_EQ(asker.ask(tires, {0x21, 0x31}).kind, ReplyKind::Silent);
    EXPECT_EQ(bench.takeAsked().size(), 2U);
    EXPECT_EQ(bench.addresses().back().tester, "2A");
    EXPECT_EQ(asker.ask(tires, {0x21, 0x31}).kind, ReplyKind::Silent);
    EXPECT_EQ(bench.addresses()[bench.addresses().size() - 2].tester, "F1") << "silence under both tells nothing";
    bench.takeAsked();
    EXPECT_EQ(asker.ask(tires, {0x3E, 0x00}, RequestPurpose::Presence).kind, ReplyKind::Silent);
    EXPECT_EQ(bench.takeAsked().size(), 1U) << "who is there is asked once";
    bench.module("750", "2132", {}).module("750", "2132", {"758037F2131"});
    EXPECT_EQ(asker.ask(tires, {0x21, 0x32}).kind, ReplyKind::Refused);
    bench.takeAsked();
    EXPECT_EQ(asker.ask(tires, {0x21, 0x31}).kind, ReplyKind::Silent);
    EXPECT_EQ(bench.takeAsked().size(), 1U) << "its own byte is known now";
}

TEST(ModuleAnswers, AreWaitedForByTheAdapterAlone)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7E4", "220106", {"7EC037F2278"});
    asker.ask(canModule("7E4"), {0x22, 1, 6});
    bench.takeAsked();
    asker.ask(canModule("7E4"), {0x22, 1, 6});
    EXPECT_EQ(bench.takeAsked().size(), 1U) << "longer than that nobody can wait";
    EXPECT_FALSE(bench.addresses().back().adaptive);
    auto const isBare = [](ModuleAnswer const& answer) {
        return answer.module == 0 && answer.code == 0 && answer.payload.empty() && !answer.detail.empty();
    };
    EXPECT_TRUE(isBare(asker.ask(canModule("7E4"), {0x2E, 1, 6, 0}))) << "it is not sent";
    bench.fallMute();
    EXPECT_TRUE(isBare(asker.ask(canModule("7E4"), {0x22, 1, 6})));
    EXPECT_EQ(describe(asker.ask(canModule("7E4"), {0x22, 1, 6})),
              "brings trouble on the bus: the adapter does not answer");
    bench.refuseAddress("ATFCSM1");
    EXPECT_TRUE(isBare(asker.ask(canModule("7E4"), {0x22, 1, 6})));
}

TEST(ModuleAnswers, MayBeInPiecesOrOutOfOrder)
{
    AddressedReply reply;
    auto const read = [&reply](std::vector<std::string> lines) {
        reply.lines = std::move(lines);
        return readReply(reply, BusKind::Can11);
    };
    EXPECT_EQ(read({"7E81009620101010203", "7E821040506"}).messages.size(), 1U);
    EXPECT_TRUE(read({"7E821040506"}).broken) << "of a message that never began";
    ReplyContent const swapped = read({"7E81010620101010203", "7E8220B0C0D0E0F1011", "7E8210405060708090A"});
    EXPECT_TRUE(swapped.messages.empty());
    EXPECT_TRUE(swapped.broken);
    reply.error = "NODATA";
    EXPECT_EQ(read({"?"}).error, "NODATA") << "the first word of trouble is told";
    reply.broken = true;
    EXPECT_TRUE(read({"7E803620101"}).broken) << "the channel lost something";
    auto const none = divideReply({0x62, 1, 1}, {{0x0101, 0}});
    ASSERT_TRUE(none) << "an identifier without data";
    EXPECT_THAT(none->at(0x0101), ElementsAre(0x62, 1, 1));
    EXPECT_EQ(ModuleAnswer().module, 0U);
    EXPECT_EQ(ModuleAnswer().code, 0);
    EXPECT_EQ(ModuleReply().id, 0U);
    EXPECT_FALSE(ReplyContent().broken);
}

TEST(ModuleAnswers, AreNamedByCodeAndFailureType)
{
    EXPECT_EQ(refusalName(0x00), "code 00");
    EXPECT_EQ(refusalName(0x10), "General Reject");
    EXPECT_EQ(refusalName(0xEF), "code EF");
    EXPECT_EQ(refusalName(0xF0), "Vehicle Maker's Specific Conditions Not Correct");
    EXPECT_EQ(refusalName(0xFE), "Vehicle Maker's Specific Conditions Not Correct");
    EXPECT_EQ(refusalName(0xFF), "code FF");
    EXPECT_EQ(failureTypeText(0x9F), "Component Failure 9F");
    EXPECT_EQ(failureTypeText(0xEF), "Reserved EF");
    EXPECT_EQ(failureTypeText(0xF0), "Maker's or Supplier's F0");
    EXPECT_EQ(failureTypeText(0xFF), "Maker's or Supplier's FF");
}

TEST(ModuleAnswers, AreSoughtAtAddressesThatFitTheBus)
{
    EXPECT_EQ(canModule("7E0", "", 0x07).flowHeader, "7E0") << "behind an address byte the adapter sends none itself";
    EXPECT_EQ(canModule("7E0", "7EA").flowHeader, "7E0") << "nor to a module that answers elsewhere";
    EXPECT_EQ(canModule("7E0", "7E8").flowHeader, "");
    EXPECT_EQ(addressOf("8210F1", "82F11000", {}, obd::ObdProtocolIso14230).reason,
              "the reply 82F11000 is not one of the module 10, which is asked");
    Signal signal;
    EXPECT_TRUE(isBroadcast(signal));
    signal.header = "7DF";
    EXPECT_TRUE(isBroadcast(signal));
    signal.header = "18DA10F1";
    EXPECT_FALSE(isBroadcast(signal));
    EXPECT_EQ(addressOf(signal, obd::ObdProtocolCan11).reason,
              "the header 18DA10F1 is none of this bus, whose identifiers have 3 digits");
    EXPECT_EQ(standardRequest(0xFF, obd::ObdProtocolIso14230), "80FFF1");
    EXPECT_EQ(standardRequest(0x00, obd::ObdProtocolIso14230), "8000F1");
    RequestAddress odd;
    odd.header = "80XXF1";
    EXPECT_EQ(answeringModule(odd), 0U);
}

ModuleAnswer refusal(unsigned char code)
{
    return {ReplyKind::Refused, 0, {}, code, {}};
}

TEST(RequestState, CountsWhatComesInARowOnly)
{
    RequestState::Time const now{std::chrono::seconds(1000)};
    auto const takes = [now](std::vector<ModuleAnswer> const& answers) {
        RequestState state;
        EXPECT_TRUE(state.isDue(now) && !state.wantsSplit() && !state.ended());
        for (ModuleAnswer const& each : answers) {
            state.take(each, now);
        }
        return state.ended()                                       ? std::string("ended")
               : state.isDue(now)                                  ? std::string("due")
               : state.isDue(now + std::chrono::milliseconds(200)) ? std::string("soon")
               : state.isDue(now + std::chrono::seconds(30))       ? std::string("later")
                                                                   : std::string("never");
    };
    ModuleAnswer const silent;
    ModuleAnswer const good{ReplyKind::Positive, 0, {}, 0, {}};
    ModuleAnswer const busy = refusal(0x21);
    EXPECT_EQ(takes({good, good, good, good}), "due");
    EXPECT_EQ(takes({silent, silent, refusal(0x10), silent, silent}), "due") << "a refusal is no silence";
    EXPECT_EQ(takes({silent, silent, refusal(0x10), silent, silent, silent}), "later");
    EXPECT_EQ(takes({busy, busy, busy}), "soon");
    EXPECT_EQ(takes({busy, busy, busy, busy}), "later");
    EXPECT_EQ(takes({busy, busy, busy, busy, busy, busy, busy}), "soon") << "after the long pause three times more";
    EXPECT_EQ(takes({busy, busy, busy, busy, busy, busy, busy, busy}), "later");
    EXPECT_EQ(takes({busy, busy, refusal(0x22), busy, busy, busy}), "soon") << "another refusal begins anew";
    EXPECT_EQ(takes({refusal(0x14), refusal(0x14)}), "due");
    EXPECT_EQ(takes({refusal(0x14), refusal(0x14), refusal(0x14)}), "ended");
    EXPECT_EQ(takes({refusal(0x78), refusal(0x78), refusal(0x78), refusal(0x78)}), "later") << "it may have time yet";
    EXPECT_EQ(takes({{ReplyKind::NotSent, 0, {}, 0, "no"}}), "ended");
    EXPECT_EQ(takes({{ReplyKind::NotReached, 0, {}, 0, "ATFCSM1"}}), "ended");
    for (ReplyKind const kind : {ReplyKind::Foreign, ReplyKind::Unreadable, ReplyKind::BusTrouble}) {
        ModuleAnswer const odd{kind, 0, {}, 0, {}};
        EXPECT_EQ(takes({odd, odd}), "due");
        EXPECT_EQ(takes({odd, odd, odd}), "later");
    }
}

class StandingGuardTest : public testing::Test
{
protected:
    std::string problem()
    {
        try {
            StandingGuard(m_bench, m_link).check();
        } catch (Error const& error) {
            return error.what();
        }
        return "none";
    }

    support::FakeClock m_clock;
    ModuleBench m_bench;
    std::function<void()> m_link = [] {};
};

TEST_F(StandingGuardTest, AsksForTheSpeedEachTenSeconds)
{
    m_bench.answer("01 0D", "41 0D 00");
    StandingGuard guard(m_bench, m_link);
    guard.check();
    guard.check();
    EXPECT_EQ(m_bench.count("01 0D"), 1);
    m_clock.advance(9999);
    guard.check();
    EXPECT_EQ(m_bench.count("01 0D"), 1);
    m_clock.advance(1);
    guard.check();
    EXPECT_EQ(m_bench.count("01 0D"), 2);
    m_clock.advance(9999);
    guard.check();
    EXPECT_EQ(m_bench.count("01 0D"), 2) << "ten seconds from then";
    EXPECT_EQ(m_bench.count("01 00"), 0);
}

TEST_F(StandingGuardTest, TakesOnlyASpeedForASpeed)
{
    m_bench.answer("01 0D", {{0x7E8, "41 0D 00"}, {0x7E9, "41 0D 01"}});
    EXPECT_EQ(problem(), "The vehicle moves (1 km/h)") << "any module may tell";
    for (char const* const other : {"41 0C 50", "7F 0D 50", "41 0D", "7F 01 12"}) {
        m_bench.answer("01 0D", other);
        EXPECT_EQ(problem(), "The vehicle no longer answers its standard requests") << other;
    }
    m_bench.answer("01 00", "41 00 BE 1F A8 13");
    EXPECT_EQ(problem(), "none") << "some vehicles tell no speed";
}

TEST_F(StandingGuardTest, EndsAtTheThirdTroubleInARow)
{
    StandingGuard guard(m_bench, m_link);
    for (bool const trouble : {true, true, false, true, true}) {
        EXPECT_NO_THROW(guard.countTrouble(trouble, "a test"));
    }
    EXPECT_THROW(guard.countTrouble(true, "a test"), Error);
    StandingGuard second(m_bench, m_link);
    EXPECT_NO_THROW(second.countTrouble(true, "a test"));
    EXPECT_NO_THROW(second.countTrouble(true, "a test"));
    EXPECT_THROW(second.countTrouble(true, "a test"), Error);
}

TEST_F(StandingGuardTest, AsksTheLinkWhetherItIsTheReason)
{
    int asked = 0;
    m_link = [&asked] {
        ++asked;
        throw Error(velmora::ErrorKind::AdapterSilent, "the adapter", {});
    };
    EXPECT_EQ(problem(), "the adapter") << "nobody answers";
    StandingGuard guard(m_bench, m_link);
    EXPECT_NO_THROW(guard.countTrouble(false, "a test"));
    EXPECT_EQ(asked, 1);
    EXPECT_THROW(guard.countTrouble(true, "a test"), Error) << "at the first trouble";
    m_bench.answer("01 00", "41 00 BE 1F A8 13");
    EXPECT_EQ(problem(), "none");
}

TEST(VehicleVin, IsTheFirstWholeOneOfAnyModule)
{
    std::string good;
    for (char const each : std::string("VELMRAS1M60000022")) {
        good += fmt::format("{:02X}", static_cast<int>(each));
    }
    auto const told = [](support::FakeProxy::Replies const& replies) {
        support::FakeProxy proxy;
        proxy.answer("09 02", replies);
        return vehicleVin(proxy);
    };
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good}}), "VELMRAS1M60000022");
    EXPECT_EQ(told({{0x7E8, "49 02 01 00 00 00" + good}}), "VELMRAS1M60000022") << "filled in front on legacy buses";
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good.substr(2)}}), "") << "a character is missing";
    EXPECT_EQ(told({{0x7E8, "49 04 01" + good}}), "");
    EXPECT_EQ(told({{0x7E8, "7F 02 01" + good}}), "");
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good.substr(2) + "20"}}), "") << "a blank";
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good.substr(2) + "7F"}}), "");
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good.substr(2) + "7E"}}), "ELMRAS1M60000022~");
    EXPECT_EQ(told({{0x7E8, "49 02 01" + good.substr(2) + "21"}}), "ELMRAS1M60000022!");
    EXPECT_EQ(told({{0x7E8, "7F 09 12"}, {0x7E9, "49 02 01" + good}}), "VELMRAS1M60000022");
    EXPECT_EQ(told({}), "");
}

TEST(ModuleCodes, AreNeitherGuessedNorAskedForInVain)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7E1", "1800FF00", {"7E9025801"});
    EXPECT_EQ(readKwpCodes(asker, canModule("7E1")).answer, TopicAnswer::Unreadable)
        << "a code is told of, but not told";
    bench.module("7E2", "1800FF00", {"7EA0158"});
    EXPECT_EQ(readKwpCodes(asker, canModule("7E2")).answer, TopicAnswer::Unreadable);
    bench.takeAsked();
    KwpCodeReport const silent = readKwpCodes(asker, canModule("7E3"));
    EXPECT_EQ(silent.reason, "is not answered");
    EXPECT_THAT(bench.takeAsked(), ElementsAre("7E3 1800FF00")) << "silence is no refusal of the way to ask";
    bench.module("7E4", "1800FF00", {"7EC037F1812"}).module("7E4", "1802FF00", {"7EC037F1822"});
    EXPECT_EQ(readKwpCodes(asker, canModule("7E4")).reason, "is refused: Conditions Not Correct");
    bench.module("7E1", "19028D", {"7E9037F1911"}).module("7E4", "19028D", {"7EC037F1911"});
    CodesByService const unreadable = readModuleCodes(asker, canModule("7E1"));
    EXPECT_TRUE(unreadable.kwp);
    EXPECT_EQ(unreadable.answer(), TopicAnswer::Unreadable);
    CodesByService const neither = readModuleCodes(asker, canModule("7E4"));
    EXPECT_FALSE(neither.kwp) << "that it knows neither service is told by the newer one";
    EXPECT_EQ(neither.answer(), TopicAnswer::Refused);

    bench.module("7E5", "19018D", {"7ED055901FF0000"}).module("7E5", "19028D", {"7ED055902FF0A1B"});
    UdsCodeReport const cut = readUdsCodes(asker, canModule("7E5"));
    EXPECT_EQ(cut.format, std::nullopt) << "the count is cut";
    EXPECT_EQ(cut.count, std::nullopt);
    EXPECT_FALSE(isStandardFormat(cut));
    EXPECT_EQ(cut.reason, "is answered unreadably");
    EXPECT_THAT(statusWords(0x01, 0xFF), ElementsAre("present"));
    EXPECT_THAT(statusWords(0x80, 0xFF), ElementsAre("lamp"));
    EXPECT_THAT(statusWords(0x0C, 0xFF), ElementsAre("confirmed", "stored")) << "pending says no more then";
    EXPECT_EQ(UdsCode().status, 0);
    EXPECT_EQ(KwpCode().status, 0);
}

} // namespace

} // namespace velmora
