// Addresses, replies and codes of modules, with the words that people get.
#include "libvelmora/uds/combinedreply.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleidentity.h"
#include "libvelmora/uds/replyframes.h"
#include "libvelmora/uds/udscodes.h"
#include "tests/support/modulebench.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::Pair;
using WordBytes = std::vector<unsigned char>;
using WordKind = ModuleAnswer::Kind;

std::string reasonOf(std::string const& header, std::string const& reply, std::optional<unsigned char> ext,
                     obd::ObdProtocol protocol)
{
    AddressOrReason const found = addressOf(header, reply, ext, protocol);
    EXPECT_EQ(found.address.has_value(), found.reason.empty());
    return found.reason;
}

TEST(ModuleWords, TellWhyAModuleCantBeAddressed)
{
    using namespace obd;
    EXPECT_EQ(reasonOf("8210F1", "", {}, ObdProtocolIso9141), "ISO 9141-2 has no header for a single module");
    EXPECT_EQ(reasonOf("7E0", "", {}, ObdProtocolIso14230),
              "the header 7E0 is none of this bus, whose headers have 6 digits");
    EXPECT_EQ(reasonOf("C010F1", "", {}, ObdProtocolIso14230), "the header C010F1 does not mean one module");
    EXPECT_EQ(reasonOf("4010F1", "", {}, ObdProtocolIso14230), "the header 4010F1 does not mean one module");
    EXPECT_EQ(reasonOf("8210F1", "", {}, ObdProtocolIso14230), "");
    EXPECT_EQ(reasonOf("686AF1", "", {}, ObdProtocolJ1850), "the header 686AF1 does not mean one module");
    EXPECT_EQ(reasonOf("6C10F1", "", {}, ObdProtocolJ1850), "");
    EXPECT_EQ(reasonOf("8210F1", "", 0x07, ObdProtocolIso14230), "only CAN has an address byte beside the header");
    EXPECT_EQ(reasonOf("8210F1", "82F111", {}, ObdProtocolIso14230),
              "the reply 82F111 is not one of the module 10, which is asked");
    EXPECT_EQ(reasonOf("8210F1", "F110", {}, ObdProtocolIso14230),
              "the reply F110 is not one of the module 10, which is asked");
    EXPECT_EQ(reasonOf("8210F1", "82F110", {}, ObdProtocolIso14230), "");
    EXPECT_EQ(reasonOf("726", "72", {}, ObdProtocolCan11), "the reply 72 is none of this bus");
    EXPECT_EQ(reasonOf("18DA10F1", "", {}, ObdProtocolCan11),
              "the header 18DA10F1 is none of this bus, whose identifiers have 3 digits");
}

TEST(ModuleWords, AddressAModuleAsItsSignalSays)
{
    Signal signal;
    signal.header = "726";
    signal.reply = "72E";
    RequestAddress const plain = addressOf(signal, obd::ObdProtocolCan11).address.value();
    EXPECT_EQ(plain.flowHeader, "726");
    EXPECT_EQ(plain.flowData, "300000");
    EXPECT_TRUE(plain.adaptive);
    EXPECT_TRUE(plain.stays);
    unsigned int const usual = plain.waitMs;
    signal.timeout = usual + 7;
    signal.tester = 0xF5;
    signal.flowControl = SignalFlowControl{"7B3", {0x30, 0x08, 0x0A}};
    RequestAddress const own = addressOf(signal, obd::ObdProtocolCan11).address.value();
    EXPECT_EQ(own.waitMs, usual + 7);
    EXPECT_EQ(own.tester, "F5");
    EXPECT_EQ(own.flowHeader, "7B3");
    EXPECT_EQ(own.flowData, "30080A");
    signal.extendedAddress = 0x07;
    signal.timeout = 8;
    signal.flowControl.reset();
    RequestAddress const extended = addressOf(signal, obd::ObdProtocolCan11).address.value();
    EXPECT_EQ(extended.waitMs, 500U) << "such modules are slow";
    EXPECT_EQ(extended.extended, "07");
    EXPECT_FALSE(extended.adaptive);
    signal = {};
    signal.header = "8210F1";
    signal.timeout = 900;
    signal.tester = 0xF5;
    RequestAddress const legacy = addressOf(signal, obd::ObdProtocolIso14230).address.value();
    EXPECT_EQ(legacy.waitMs, 900U);
    EXPECT_EQ(legacy.tester, RequestAddress().tester) << "which is a part of the header there";
    EXPECT_EQ(answeringModule(legacy), 0x10U);
    EXPECT_EQ(answeringModule(own), 0x72EU);
    EXPECT_EQ(answeringModule(RequestAddress()), 0U);
    EXPECT_EQ(shownModule("80F111"), "11");
    EXPECT_EQ(shownModule("7E8"), "7E8");
    EXPECT_EQ(standardRequest(0x11, obd::ObdProtocolIso14230), "8011F1");
    EXPECT_EQ(standardRequest(0x100, obd::ObdProtocolIso14230), std::nullopt);
    EXPECT_EQ(standardRequest(0x7E7, obd::ObdProtocolCan11), std::nullopt);
    EXPECT_EQ(standardRequest(0x7E8, obd::ObdProtocolCan11), "7E0");
    EXPECT_EQ(standardRequest(0x7EF, obd::ObdProtocolCan11), "7E7");
    EXPECT_EQ(standardRequest(0x7F0, obd::ObdProtocolCan11), std::nullopt);
    EXPECT_EQ(standardRequest(0x18DAF200, obd::ObdProtocolCan29), std::nullopt);
    EXPECT_EQ(identifierText(0x7FF), "7FF");
    EXPECT_EQ(identifierText(0x800), "00000800");
    EXPECT_EQ(identifierText(0x12), "012");
}

TEST(ModuleWords, DivideACombinedReply)
{
    std::map<unsigned int, std::size_t> const lengths = {{0x0101, 1}, {0x0102, 2}};
    auto const parts = divideReply({0x62, 1, 1, 5, 1, 2, 6, 7}, lengths);
    ASSERT_TRUE(parts);
    EXPECT_THAT(*parts,
                ElementsAre(Pair(0x0101U, ElementsAre(0x62, 1, 1, 5)), Pair(0x0102U, ElementsAre(0x62, 1, 2, 6, 7))));
    EXPECT_TRUE(divideReply({0x62}, lengths)->empty());
    for (WordBytes const& odd : std::vector<WordBytes>{
             {0x62, 1}, {0x62, 1, 1}, {0x62, 1, 2, 6}, {0x62, 1, 3, 6}, {0x62, 1, 1, 5, 1}, {0x62, 1, 1, 5, 1, 1, 5}}) {
        EXPECT_FALSE(divideReply(odd, lengths)) << odd.size();
    }
}

TEST(ModuleWords, ReadWhatTheAdapterShows)
{
    AddressedReply reply;
    reply.lines = {"7E803620101", "7E9", "?"};
    ReplyContent const mixed = readReply(reply, BusKind::Can11);
    EXPECT_EQ(mixed.messages.size(), 1U);
    EXPECT_TRUE(mixed.broken) << "a line that is cut";
    EXPECT_EQ(mixed.error, "?") << "by which the adapter refuses";
    reply.lines = {"7E8100A622805112233"};
    EXPECT_TRUE(readReply(reply, BusKind::Can11).broken) << "the rest is missing";
    reply.lines = {"7E803620101"};
    reply.error = "NODATA";
    ReplyContent const plain = readReply(reply, BusKind::Can11);
    EXPECT_FALSE(plain.broken);
    EXPECT_EQ(plain.error, "NODATA");

    ReplyContent content;
    EXPECT_EQ(judgeReply({0x22, 1, 2}, content).kind, WordKind::Silent);
    content.broken = true;
    EXPECT_EQ(judgeReply({0x22, 1, 2}, content).kind, WordKind::Unreadable);
    content.error = "NODATA";
    EXPECT_EQ(judgeReply({0x22, 1, 2}, content).kind, WordKind::Unreadable);
    content.error = "CAN ERROR";
    ModuleAnswer const trouble = judgeReply({0x22, 1, 2}, content);
    EXPECT_EQ(describe(trouble), "brings trouble on the bus: CAN ERROR");
    auto const judged = [](WordBytes const& request, std::vector<WordBytes> const& payloads) {
        ReplyContent heard;
        for (WordBytes const& each : payloads) {
            heard.messages.push_back({0x7E8, each});
        }
        ModuleAnswer const answer = judgeReply(request, heard);
        return answer.kind == WordKind::Positive ? std::string("good") : describe(answer);
    };
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x62, 1, 3}}), "is answered by something else");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x62, 1}}), "is answered by something else");
    EXPECT_EQ(judged({0x22, 1, 2}, {{}, {0x62, 1, 2}}), "good");
    EXPECT_EQ(judged({0x22, 1, 2, 1, 3}, {{0x62, 1, 3}}), "good") << "of several some may be left out";
    EXPECT_EQ(judged({0x22, 1, 2, 1, 3}, {{0x62, 1}}), "is answered by something else");
    EXPECT_EQ(judged({0x19, 2, 0x8D}, {{0x59, 2}}), "good");
    EXPECT_EQ(judged({0x19, 2, 0x8D}, {{0x59, 1}}), "is answered by something else");
    EXPECT_EQ(judged({0x3E, 0}, {{0x7E, 0}}), "good");
    EXPECT_EQ(judged({0x3E}, {{0x7E}}), "good");
    for (unsigned int const service : {0x18U, 0x13U, 0x03U, 0x07U, 0x0AU}) {
        EXPECT_EQ(
            judged({static_cast<unsigned char>(service), 0x55}, {{static_cast<unsigned char>(service + 0x40), 9}}),
            "good")
            << service;
    }
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x22}}), "is answered by something else");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x21, 0x31}}), "is answered by something else");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x22, 0x78}, {0x7F, 0x22, 0x31}, {0x7F, 0x22, 0x33}}),
              "is refused: Request Out of Range");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x22, 0x78}}), "asks for time and then does not answer");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x22, 1, 2, 0x12}}), "is refused: Subfunction Not Supported") << "on J1850";
    EXPECT_EQ(judged({0x21, 1}, {{0x7F, 0x21, 1, 0x12}}), "is refused: Subfunction Not Supported");
    EXPECT_EQ(judged({0x22, 1, 2}, {{0x7F, 0x22, 0x12, 0, 0}}), "is refused: Subfunction Not Supported");
}

class ModuleIdentityTest : public testing::Test
{
protected:
    FoundModule identified(std::string const& request, std::string const& reply)
    {
        FoundModule module;
        module.request = request;
        module.reply = reply;
        ModuleIdentity(m_asker, [this] { ++m_checks; }).identify(module);
        return module;
    }

    support::ModuleBench m_bench;
    ModuleAsker m_asker{m_bench, m_bench};
    int m_checks = 0;
};

TEST_F(ModuleIdentityTest, IsReadByIdentifiersOfIso14229)
{
    m_bench.module("7E0", "22F197", {"7E8 06 62 F1 97 45 43 4D"}).module("7E0", "22F187", {"7E80562F1874142"});
    m_bench.module("7E0", "22F197", {"7E80662F19745434D"});
    m_bench.module("7E0", "22F195", {"7E80562F1953132"});
    m_bench.module("7E0", "19028D", {"7E8075902FF0A1B0008"});
    FoundModule const module = identified("7E0", "7E8");
    EXPECT_EQ(module.part, "AB");
    EXPECT_EQ(module.software, "12") << "the second of two identifiers";
    EXPECT_EQ(module.codes, 1U);
    EXPECT_EQ(m_checks, 5);
    m_bench.module("7E0", "22F189", {"7E80562F1893333"});
    EXPECT_EQ(identified("7E0", "7E8").software, "33");
    FoundModule wrong = identified("18DA10F1", "");
    EXPECT_EQ(wrong.codes, std::nullopt);
    FoundModule all;
    all.request = "7E0";
    all.reply = "7E8";
    ModuleIdentity(m_asker, [] {}).readIdentifiers(all);
    EXPECT_EQ(all.identifiers.at(0xF187), "AB");
    EXPECT_EQ(all.identifiers.at(0xF189), "33");
    EXPECT_EQ(all.identifiers.at(0xF195), "12");
}

TEST_F(ModuleIdentityTest, IsReadByService1AWhereThatIsMissing)
{
    m_bench.module("7E1", "22F197", {"7E9037F2211"}).module("7E1", "1A80", {"7E9045A804142"});
    m_bench.module("7E1", "1A90", {"7E9037F1A31"}).module("7E1", "1A9B", {"7E9045A9B4344"});
    m_bench.module("7E1", "19028D", {"7E9037F1911"}).module("7E1", "1800FF00", {"7E90858020133E00171E0"});
    m_bench.module("7E1", "1802FF00", {"7E9055801012361"});
    FoundModule const module = identified("7E1", "7E9");
    EXPECT_EQ(module.part, "");
    ASSERT_EQ(module.identifiers.size(), 2U) << "a refusal may be of one identifier alone";
    EXPECT_EQ(module.identifiers.at(0x1A80), "AB");
    EXPECT_EQ(module.identifiers.at(0x1A9B), "CD");
    m_bench.module("7E2", "22F197", {"7EA037F2211"}).module("7E2", "1A80", {"7EA037F1A11"});
    m_bench.module("7E2", "1A9B", {"7EA045A9B4344"});
    EXPECT_TRUE(identified("7E2", "7EA").identifiers.empty()) << "nor is that known";
}

TEST_F(ModuleIdentityTest, ReadsCodesOfIso14230)
{
    RequestAddress const address = addressOf("7E0", {}, {}, obd::ObdProtocolCan11).address.value();
    m_bench.module("7E0", "1800FF00", {"7E8055801013361"});
    KwpCodeReport const one = readKwpCodes(m_asker, address);
    EXPECT_EQ(one.answer, TopicAnswer::Read);
    ASSERT_EQ(one.codes.size(), 1U);
    EXPECT_EQ(one.codes[0].hex(), "0133");
    EXPECT_EQ(one.codes[0].status, 0x61);
    m_bench.module("7E1", "1800FF00", {"7E9037F1812"}).module("7E1", "1802FF00", {"7E9025800"});
    RequestAddress const second = addressOf("7E1", {}, {}, obd::ObdProtocolCan11).address.value();
    EXPECT_EQ(readKwpCodes(m_asker, second).answer, TopicAnswer::Read);
    EXPECT_TRUE(readKwpCodes(m_asker, second).codes.empty());
    m_bench.module("7E2", "1800FF00", {"7EA04580201 33"}).module("7E3", "1800FF00", {"7EB037F1811"});
    m_bench.module("7E3", "1802FF00", {"7EB025800"}).module("7E2", "1800FF00", {"7EA0458020133"});
    RequestAddress const cut = addressOf("7E2", {}, {}, obd::ObdProtocolCan11).address.value();
    readKwpCodes(m_asker, cut);
    EXPECT_EQ(readKwpCodes(m_asker, cut).answer, TopicAnswer::Unreadable);
    EXPECT_EQ(readKwpCodes(m_asker, cut).reason, "is answered unreadably");
    RequestAddress const unknown = addressOf("7E3", {}, {}, obd::ObdProtocolCan11).address.value();
    EXPECT_EQ(readKwpCodes(m_asker, unknown).answer, TopicAnswer::Refused)
        << "a service that is missing is not asked twice";
    for (int const code : {0x10, 0x11, 0x12, 0x7F}) {
        EXPECT_TRUE(isServiceMissing(static_cast<unsigned char>(code))) << code;
    }
    EXPECT_FALSE(isServiceMissing(0x31));
    UdsCode code;
    code.bytes[0] = 0x92;
    code.bytes[1] = 0x34;
    code.bytes[2] = 0x56;
    EXPECT_EQ(code.code(), "B1234");
    EXPECT_EQ(code.hex(), "923456");
    code.bytes[0] = 0xF2;
    EXPECT_EQ(code.code(), "U3234");
    code.bytes[0] = 0x40;
    EXPECT_EQ(code.code(), "C0034");
}

} // namespace

} // namespace velmora
