// Modules of the buses before CAN by headers of their own, and those that speak ISO 14230-3 on any bus.

#include "libvelmora/channel/busline.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/moduleidentity.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/car.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <map>

namespace velmora {

namespace {

using support::ModuleBench;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Pair;
using LegacyKind = ModuleAnswer::Kind;

RequestAddress legacyAt(std::string const& header, obd::ObdProtocol protocol = obd::ObdProtocolIso14230)
{
    return addressOf(header, {}, {}, protocol).address.value();
}

std::string legacyReason(std::string const& header, obd::ObdProtocol protocol, std::string const& reply = {},
                         std::optional<unsigned char> ext = {})
{
    return addressOf(header, reply, ext, protocol).reason;
}

TEST(LegacyAddress, IsAHeaderThatMeansOneModule)
{
    EXPECT_EQ(legacyAt("8011F1").header, "8011F1");
    EXPECT_EQ(legacyAt("8011F1").reply, "") << "no filter of the adapter";
    EXPECT_TRUE(legacyAt("8011F1").stays);
    EXPECT_EQ(answeringModule(legacyAt("8011F1")), 0x11U);
    EXPECT_EQ(legacyAt("6C10F1", obd::ObdProtocolJ1850).header, "6C10F1");
    EXPECT_EQ(legacyAt("E410F1", obd::ObdProtocolJ1850).header, "E410F1");
    EXPECT_EQ(legacyReason("8011F1", obd::ObdProtocolIso14230, "80F111"), "");
    EXPECT_THAT(legacyReason("8011F1", obd::ObdProtocolIso14230, "80F118"), HasSubstr("not one of the module 11"));
    EXPECT_THAT(legacyReason("C133F1", obd::ObdProtocolIso14230), HasSubstr("does not mean one module"));
    EXPECT_THAT(legacyReason("686AF1", obd::ObdProtocolJ1850), HasSubstr("does not mean one module"));
    EXPECT_THAT(legacyReason("8011F1", obd::ObdProtocolIso9141), HasSubstr("no header for a single module"));
    EXPECT_THAT(legacyReason("7E0", obd::ObdProtocolIso14230), HasSubstr("headers have 6 digits"));
    EXPECT_THAT(legacyReason("8011F1", obd::ObdProtocolIso14230, {}, 0x07), HasSubstr("only CAN"));
    EXPECT_EQ(standardRequest(0x11, obd::ObdProtocolIso14230), "8011F1");
    EXPECT_EQ(shownModule("80F111"), "11");
    EXPECT_EQ(shownModule("7E8"), "7E8");
}

TEST(LegacyAddress, AsksAllModulesByTheHeadersOfTheStandards)
{
    for (char const* const header : {"7DF", "18DB33F1", "DB33F1", "686AF1", "616AF1", "C033F1", "C233F1"}) {
        EXPECT_TRUE(isFunctionalHeader(header)) << header;
    }
    for (char const* const header : {"7E0", "18DA10F1", "DA10F1", "6C10F1", "8233F1", "C010F1"}) {
        EXPECT_FALSE(isFunctionalHeader(header)) << header;
    }
}

TEST(LegacyModules, AnswerByTheirOwnAddressOnly)
{
    ModuleBench bench;
    bench.setProtocol(obd::ObdProtocolIso14230);
    ModuleAsker asker(bench, bench);
    bench.module("8011F1", "2101", {"83F11861013C2A", "84F1116101002D14"});
    bench.module("8018F1", "2101", {"84F1116101002D14"});
    bench.module("8011F1", "2130", {"83F1117F213128"});
    EXPECT_THAT(asker.ask(legacyAt("8011F1"), {0x21, 0x01}).payload, ElementsAre(0x61, 0x01, 0x00, 0x2D));
    EXPECT_EQ(asker.ask(legacyAt("8018F1"), {0x21, 0x01}).kind, LegacyKind::Silent) << "another module spoke";
    ModuleAnswer const refused = asker.ask(legacyAt("8011F1"), {0x21, 0x30});
    EXPECT_EQ(refused.kind, LegacyKind::Refused);
    EXPECT_EQ(refused.code, 0x31);
}

TEST(LegacyModules, OfJ1850RepeatTheRequestInFrontOfARefusal)
{
    ModuleBench bench;
    bench.setProtocol(obd::ObdProtocolJ1850);
    ModuleAsker asker(bench, bench);
    RequestAddress const engine = legacyAt("6C10F1", obd::ObdProtocolJ1850);
    bench.module("6C10F1", "221172", {"6CF11062117236EA"}).module("6C10F1", "221173", {"6CF1107F22117331AB"});
    EXPECT_THAT(asker.ask(engine, {0x22, 0x11, 0x72}).payload, ElementsAre(0x62, 0x11, 0x72, 0x36));
    ModuleAnswer const refused = asker.ask(engine, {0x22, 0x11, 0x73});
    EXPECT_EQ(refused.kind, LegacyKind::Refused);
    EXPECT_EQ(refused.code, 0x31) << "not 11, which is of the identifier";
}

TEST(LegacyLines, MayHaveTheirLengthBehindTheAddresses)
{
    std::string digits = "80F11141";
    for (int i = 0; i < 0x41; ++i) {
        digits += "5A";
    }
    auto const line = parseBusLine(BusKind::Kwp, digits + "00");
    ASSERT_TRUE(line);
    EXPECT_EQ(line->module, 0x11U);
    EXPECT_EQ(line->payload.size(), 0x41U);
    EXPECT_TRUE(parseBusLine(BusKind::Kwp, digits)) << "some adapters print no check byte";
    EXPECT_FALSE(parseBusLine(BusKind::Kwp, digits.substr(0, digits.size() - 2))) << "a byte is lost";
    EXPECT_FALSE(parseBusLine(BusKind::Kwp, "80F1110000")) << "no data at all";
}

TEST(KwpCodes, AreReadInTheFormThatTheModuleKnows)
{
    ModuleBench bench;
    bench.setProtocol(obd::ObdProtocolIso14230);
    ModuleAsker asker(bench, bench);
    bench.module("8011F1", "1800FF00", {"85F11158010420E812"});
    bench.module("8011F1", "1800FF00", {"83F1117F181210"}).module("8011F1", "1802FF00", {"85F11158010420E803"});
    bench.module("8012F1", "1800FF00", {"82F112580000"});
    bench.module("8013F1", "1800FF00", {"83F1137F181100"});
    bench.module("8014F1", "1800FF00", {"84F11458020420AA"});
    EXPECT_EQ(readModuleCodes(asker, legacyAt("8011F1")).count(), 1U);
    CodesByService const second = readModuleCodes(asker, legacyAt("8011F1"));
    ASSERT_TRUE(second.kwp);
    ASSERT_EQ(second.kwp->codes.size(), 1U);
    EXPECT_EQ(second.kwp->codes[0].hex(), "0420");
    EXPECT_EQ(second.kwp->codes[0].status, 0xE8);
    EXPECT_EQ(second.count(), 1U);
    EXPECT_EQ(readModuleCodes(asker, legacyAt("8012F1")).count(), 0U) << "none is not the same as no answer";
    CodesByService const refused = readModuleCodes(asker, legacyAt("8013F1"));
    EXPECT_EQ(refused.answer(), TopicAnswer::Refused);
    EXPECT_EQ(refused.count(), std::nullopt);
    EXPECT_EQ(readModuleCodes(asker, legacyAt("8014F1")).answer(), TopicAnswer::Unreadable) << "a code is missing";
    EXPECT_EQ(readModuleCodes(asker, legacyAt("8015F1")).answer(), TopicAnswer::Silent);
    for (std::string const& each : bench.takeAsked()) {
        EXPECT_THAT(each, testing::Not(HasSubstr(" 19"))) << "nobody knows service 19 on these buses";
    }
}

TEST(KwpCodes, AreAskedOnCanWhereServiceNineteenIsMissing)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    auto const at = [](char const* header) { return addressOf(header, {}, {}, obd::ObdProtocolCan11).address.value(); };
    bench.module("7E1", "19018D", {"7E9037F1911"}).module("7E1", "19028D", {"7E9037F1911"});
    bench.module("7E1", "1800FF00", {"7E9055801C15560"});
    CodesByService const old = readModuleCodes(asker, at("7E1"));
    ASSERT_TRUE(old.kwp);
    EXPECT_EQ(old.kwp->codes.at(0).hex(), "C155");
    bench.module("7E2", "19018D", {"7EA037F1922"}).module("7E2", "19028D", {"7EA037F1922"});
    bench.takeAsked();
    CodesByService const later = readModuleCodes(asker, at("7E2"));
    EXPECT_FALSE(later.kwp);
    EXPECT_EQ(later.answer(), TopicAnswer::Refused);
    EXPECT_THAT(bench.takeAsked(), ElementsAre("7E2 19018D", "7E2 19028D")) << "it knows 19, just not now";
    bench.module("7E3", "19018D", {"7EB037F1911"}).module("7E3", "19028D", {"7EB037F1911"});
    EXPECT_EQ(describe({LegacyKind::Refused, 0, {}, 0x11, {}}), readModuleCodes(asker, at("7E3")).uds.reason)
        << "it knows neither";
}

TEST(ModuleIdentity, AsksByService1AWhere22IsMissing)
{
    ModuleBench bench;
    ModuleAsker asker(bench, bench);
    ModuleIdentity identity(asker, [] {});
    bench.module("7D6", "22F197", {"7DE037F2211"}).module("7D6", "22F180", {"7DE037F2211"});
    bench.module("7D6", "1A80", {"7DE037F1A12"}); // what ISO 14230-3 has for an identifier that is not there
    bench.module("7D6", "1A90", {"7DE075A9053314D3630"}).module("7D6", "1A9B", {"7DE045A9B0102"});
    FoundModule module{"7D6", "7DE", {}, {}, {}, {}};
    identity.identify(module);
    EXPECT_THAT(module.identifiers, ElementsAre(Pair(0x1A90U, "S1M60"), Pair(0x1A9BU, "0102")));
    EXPECT_EQ(module.codes, std::nullopt);
    bench.takeAsked();
    module.identifiers.clear();
    identity.readIdentifiers(module);
    EXPECT_THAT(bench.takeAsked(), ElementsAre("7D6 22F180", "7D6 1A80", "7D6 1A90", "7D6 1A9B")) << "no 31 more";
    EXPECT_EQ(module.identifiers.size(), 2U);
    EXPECT_EQ(identifierName(0x1A90), "Identification 90 by service 1A");
    EXPECT_EQ(identifierName(0xF187), "Vehicle Maker's Spare Part Number");

    bench.setProtocol(obd::ObdProtocolIso14230);
    bench.module("8011F1", "1A90", {"83F1115A904100"});
    FoundModule engine{"8011F1", "80F111", {}, {}, {}, {}};
    identity.identify(engine);
    EXPECT_THAT(engine.identifiers, ElementsAre(Pair(0x1A90U, "A")));
}

char const* const kwpSignals = R"toml(
[[signal]]
id = "INJECTION"
name = "Engine speed by the engine's own block"
header = "8011F1"
reply = "80F111"
request = "2101"
formula = "int16(A, B)/4"
unit = "rpm"

[[signal]]
id = "OIL"
name = "Gearbox oil"
header = "8218F1"
reply = "82F118"
request = "2101"
formula = "A-40"

[[signal]]
id = "LONG"
name = "The 64th byte of a long reply"
header = "8011F1"
reply = "80F111"
request = "2102"
formula = "BL"

[[signal]]
id = "NOBODY"
name = "A module that is not there"
header = "8040F1"
reply = "80F140"
request = "2101"
formula = "A"
)toml";

// The whole car: what is set for a module is taken back before standard requests.
TEST(LegacyModules, OfASimulatedCarAreReadBesideStandardSensors)
{
    testsupport::TemporaryFolder folder;
    CarOptions options;
    options.port = "sim:petrol-kwp-fast?instant";
    options.settingsFile = folder.file("settings.toml");
    options.signalFiles = {folder.file("kwp.toml")};
    std::ofstream(folder.file("kwp.toml")) << kwpSignals;
    Car car(options);
    std::vector<Reading> const readings = car.read({"INJECTION", "RPM", "OIL", "LONG", "NOBODY", "SPEED"});
    std::map<std::string, Reading const*> bySensor;
    for (Reading const& each : readings) {
        bySensor[each.sensor] = &each;
    }
    ASSERT_TRUE(number(*bySensor.at("INJECTION")));
    EXPECT_GT(*number(*bySensor.at("INJECTION")), 500);
    EXPECT_EQ(bySensor.at("INJECTION")->module, 0x11U);
    EXPECT_EQ(number(*bySensor.at("OIL")), 20);
    EXPECT_EQ(number(*bySensor.at("LONG")), 63);
    EXPECT_FALSE(number(*bySensor.at("NOBODY")));
    EXPECT_TRUE(number(*bySensor.at("RPM")));
    EXPECT_TRUE(number(*bySensor.at("SPEED")));
}

TEST(LegacyModules, OfAJ1850CarAnswerAtTheirOwnHeader)
{
    testsupport::TemporaryFolder folder;
    CarOptions options;
    options.port = "sim:petrol-vpw?instant";
    options.settingsFile = folder.file("settings.toml");
    options.signalFiles = {folder.file("vpw.toml")};
    std::ofstream(folder.file("vpw.toml")) << "[[signal]]\nid = \"OIL\"\nname = \"Oil\"\nheader = \"6C18F1\"\n"
                                              "reply = \"6CF118\"\nrequest = \"220102\"\nformula = \"A-40\"\n";
    Car car(options);
    std::vector<Reading> const readings = car.read({"OIL", "RPM"});
    ASSERT_EQ(readings.size(), 2U);
    for (Reading const& each : readings) {
        EXPECT_TRUE(number(each)) << each.sensor;
        EXPECT_EQ(each.module, each.sensor == "OIL" ? 0x18U : 0x10U);
    }
}

} // namespace

} // namespace velmora
