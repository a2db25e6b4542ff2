// Built-in definitions: PIDs beyond the core's, identifiers of ISO 14229, failure types.

#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/signal/signalset.h"
#include "libvelmora/uds/failuretype.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/signalboard.h"
#include "tests/support/hexbytes.h"

#include <gtest/gtest.h>

namespace velmora {

namespace {

std::size_t onlyOne(SignalSet const& set, std::string const& word)
{
    std::vector<std::size_t> const found = set.find(word);
    EXPECT_EQ(found.size(), 1U) << word;
    return found.empty() ? 0 : found.front();
}

std::string told(std::string const& id, std::string const& reply)
{
    auto const set = std::make_shared<SignalSet const>();
    SignalBoard board(set);
    PollResult const result =
        board.take({onlyOne(*set, id), 0x7E8U, {}, true}, 0x7E8, 0x7E8, support::hexBytes(reply), SignalBoard::Time());
    return result.values.empty() ? "-" : result.values.front()->value;
}

TEST(BuiltinPids, DecodeWhatRepliesOfCarsHold)
{
    EXPECT_EQ(told("ODOMETER", "41 A6 00 01 E2 40"), "12345.6");
    EXPECT_EQ(told("FRICTION_TORQUE", "41 8E 7D"), "0");
    EXPECT_EQ(told("EXHAUST_FLOW", "41 9E 00 64"), "20.00");
    EXPECT_EQ(told("HV_VOLTAGE", "41 9A 0E 02 58 00 FF 9C"), "352.00");
    EXPECT_EQ(told("HV_CURRENT", "41 9A 0E 02 58 00 FF 9C"), "-10.0");
    EXPECT_EQ(told("HV_MODE_ENHANCED", "41 9A 0E 02 58 00 FF 9C"), "depleting") << "the state is in the second byte";
    EXPECT_EQ(told("HV_MODE", "41 9A 0E 02 58 00 FF 9C"), "-") << "its support bit is 0: it is not told";
    EXPECT_EQ(told("FUEL_USE_A_BANK_1", "41 9F 01 FF 00 00 00 00 00 00 00"), "100.0");
    EXPECT_EQ(told("FUEL_USE_B_BANK_1", "41 9F 01 FF FF 00 00 00 00 00 00"), "-");
    EXPECT_EQ(told("ODOMETER", "41 A6 00 01 E2"), "-") << "another length";
}

TEST(BuiltinPids, TellHowWellTheyAreKnown)
{
    SignalSet const set;
    SignalEntry const& listed = set[onlyOne(set, "SPEED_LIMIT")];
    EXPECT_EQ(listed.signal.name, "Current Vehicle Speed Limit (one source)");
    EXPECT_EQ(set.find("0xA6"), set.find("01a6"));
    EXPECT_EQ(set.find("9A").size(), 4U);
    SignalEntry const& odometer = set[onlyOne(set, "ODOMETER")];
    EXPECT_EQ(odometer.signal.min, 0.0);
    EXPECT_NEAR(odometer.signal.max.value_or(0), 429496729.5, 0.1) << "four bytes of a tenth of a kilometre";
    for (BuiltinPid const& each : builtinPids()) {
        bool const decoded = each.standing != PidStanding::Unverified && each.standing != PidStanding::NameOnly;
        EXPECT_EQ(isDecoded(each), decoded) << each.signal.id;
        EXPECT_EQ(each.signal.request, (std::vector<unsigned char>{0x01, each.pid})) << each.signal.id;
        EXPECT_TRUE(each.signal.unit.empty() || each.signal.values.empty()) << each.signal.id;
    }
}

TEST(Identification, ReadsStandardIdentifiers)
{
    EXPECT_EQ(standardIdentifiers().size(), 32U);
    EXPECT_EQ(identifierText(0xF187, support::hexBytes("32 38 34 30 30 20 00 FF")), "28400");
    EXPECT_EQ(identifierText(0xF187, support::hexBytes("01 02 03")), "010203") << "no text";
    EXPECT_EQ(identifierText(0xF181, support::hexBytes("01 41 42 43")), "ABC") << "behind a count";
    EXPECT_EQ(identifierText(0xF18B, support::hexBytes("23 05 17")), "2023-05-17");
    EXPECT_EQ(identifierText(0xF18B, support::hexBytes("20 23 05 17")), "2023-05-17");
    EXPECT_EQ(identifierText(0xF18B, support::hexBytes("23 15 17")), "231517") << "there is no such month";
    EXPECT_EQ(identifierText(0xF186, support::hexBytes("01")), "default session");
    EXPECT_EQ(identifierText(0xF186, support::hexBytes("60")), "60");
    EXPECT_EQ(identifierText(0xF183, support::hexBytes("41 42")), "4142");
    std::pair<unsigned int, std::pair<char const*, char const*>> const cases[] = {
        {0xF186, {"00", "00"}},
        {0xF186, {"02", "programming session"}},
        {0xF186, {"03", "extended session"}},
        {0xF186, {"04", "safety system session"}},
        {0xF186, {"05", "05"}},
        {0xF186, {"01 01", "0101"}},
        {0xF181, {"00 41 42", "AB"}},
        {0xF181, {"1F 41 42", "AB"}},
        {0xF181, {"20 41 42", "AB"}},
        {0xF181, {"01", "01"}},
        {0xF181, {"01 41", "A"}},
        {0xF181, {"41", "A"}},
        {0xF190, {"41 20 42", "A B"}},
        {0xF190, {"7E", "~"}},
        {0xF190, {"7F", "7F"}},
        {0xF190, {"FF FF", ""}},
        {0xF190, {"00 41 FF", "A"}},
        {0xF18B, {"23 12 31", "2023-12-31"}},
        {0xF18B, {"23 13 01", "231301"}},
        {0xF18B, {"23 00 01", "230001"}},
        {0xF18B, {"23 01 00", "230100"}},
        {0xF18B, {"23 01 32", "230132"}},
        {0xF18B, {"23 0A 01", "230A01"}},
        {0xF18B, {"23 01", "2301"}},
        {0xF18B, {"23 01 01", "2023-01-01"}},
        {0xF18B, {"23 09 29", "2023-09-29"}},
        {0xF18B, {"23 01 1A", "23011A"}},
        {0xF186, {"", ""}},
        {0xF18B, {"41 42 43", "ABC"}},
        {0xFFFF, {"41 42", "4142"}},
    };
    for (auto const& [did, row] : cases) {
        EXPECT_EQ(identifierText(did, support::hexBytes(row.first)), row.second) << std::hex << did << " " << row.first;
    }
    EXPECT_EQ(localIdentifierText(support::hexBytes("41 42 20")), "AB");
    EXPECT_EQ(localIdentifierText(support::hexBytes("01 42")), "0142");
    EXPECT_EQ(identifierName(0xF190), "Vehicle Identification Number");
    EXPECT_EQ(identifierName(0x1A80), "Identification 80 by service 1A");
}

TEST(FailureType, HasANameOnlyWhereListsAgree)
{
    EXPECT_EQ(failureTypeText(0x11), "Circuit Short to Ground");
    EXPECT_EQ(failureTypeText(0x1C), "Circuit Voltage Out of Range") << "a majority";
    EXPECT_EQ(failureTypeText(0x06), "General Failure 06") << "one list alone";
    EXPECT_EQ(failureTypeText(0x2A), "General Signal Failure 2A");
    EXPECT_EQ(failureTypeText(0x5F), "System Programming Failure 5F");
    EXPECT_EQ(failureTypeText(0xA3), "Reserved A3");
    EXPECT_EQ(failureTypeText(0xF3), "Maker's or Supplier's F3");
}

TEST(SignalSet, FitsVins)
{
    EXPECT_TRUE(fitsVin("", "ANY"));
    EXPECT_TRUE(fitsVin("WEX*", "wex12345678901234"));
    EXPECT_TRUE(fitsVin("*1?3*", "ABC123"));
    EXPECT_TRUE(fitsVin("A*B*C", "AxxBxxBxC"));
    EXPECT_FALSE(fitsVin("WEX*", "WEY12345678901234"));
    EXPECT_FALSE(fitsVin("A?", "A"));
    EXPECT_FALSE(fitsVin("****************************************B", std::string(1000, 'A'))) << "and soon";
}

} // namespace

} // namespace velmora
