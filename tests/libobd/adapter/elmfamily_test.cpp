#include "libobd/adapter/elmfamily.h"

#include <gtest/gtest.h>

namespace {

using obd::BaudRateDialogue;
using obd::ElmFamily;

std::string labelOf(std::string const& name)
{
    ElmFamily const* family = obd::recogniseFamily(name);
    return family != nullptr ? std::string(family->label) : "unknown";
}

// Every trait, in one line.
std::string traitsOf(std::string const& device)
{
    std::string text;
    for (auto const column : {&ElmFamily::describe, &ElmFamily::identify, &ElmFamily::protocolNumber,
                              &ElmFamily::voltage, &ElmFamily::setProtocol, &ElmFamily::tryProtocol}) {
        text += std::string(obd::familyTrait(device, column)) + " ";
    }
    text += obd::familyTrait(device, &ElmFamily::echoesProtocol) ? "= " : "OK ";
    switch (obd::familyTrait(device, &ElmFamily::baudRate)) {
    case BaudRateDialogue::Divisor:
        return text + "ATBRD";
    case BaudRateDialogue::Code:
        return text + "ATSCS";
    case BaudRateDialogue::Refused:
        return text + "refused";
    default:
        return text + "nothing";
    }
}

TEST(ElmFamily, NameLineTellsTheFamilyInAnyLetterCase)
{
    EXPECT_EQ(labelOf("ELM327 v1.5"), "ELM interface: ");
    EXPECT_EQ(labelOf("elm327 v1.5"), "ELM interface: ");
    EXPECT_EQ(labelOf("OBDKey 1.30"), "OBDKey interface: ");
    EXPECT_EQ(labelOf("Diamex DXM v1.2"), "Diamex interface: ");
    EXPECT_EQ(labelOf("PLXKiwi v1.2"), "Kiwi interface: ");
}

TEST(ElmFamily, FirstWordInOrderWins)
{
    EXPECT_EQ(labelOf("DIAMEX ELM327 v1.5"), "ELM interface: ");
    EXPECT_EQ(labelOf("PLXKIWI DIAMEX OBDKEY"), "OBDKey interface: ");
    EXPECT_EQ(labelOf("PLXKIWI DIAMEX"), "Diamex interface: ");
}

TEST(ElmFamily, OtherNamesAreUnknown)
{
    EXPECT_EQ(labelOf("PLX Kiwi 1.0"), "unknown");
    EXPECT_EQ(labelOf("OBDPros v2"), "unknown");
    EXPECT_EQ(labelOf("STN1170 v4.0"), "unknown");
    EXPECT_EQ(labelOf(""), "unknown");
}

TEST(ElmFamily, OnlyTheDiamexNameHasItsVersionInTheThirdWord)
{
    EXPECT_EQ(obd::recogniseFamily("ELM327 v1.5")->versionWord, 2u);
    EXPECT_EQ(obd::recogniseFamily("OBDKey 1.30")->versionWord, 2u);
    EXPECT_EQ(obd::recogniseFamily("PLXKIWI 1.0")->versionWord, 2u);
    EXPECT_EQ(obd::recogniseFamily("DIAMEX DXM v1.2")->versionWord, 3u);
}

TEST(ElmFamily, TraitsOfEveryFamily)
{
    std::string const common = "AT@1 AT@2 ATDPN ATRV ATSP ATTP OK ";
    EXPECT_EQ(traitsOf("ELM327 v1.5"), common + "ATBRD");
    EXPECT_EQ(traitsOf("OBDKey 1.30"), common + "refused");
    EXPECT_EQ(traitsOf("PLXKIWI 1.0"), common + "ATBRD");
    EXPECT_EQ(traitsOf("OBDPros v2"), common + "ATSCS");
    EXPECT_EQ(traitsOf("STN1170 v4.0"), common + "ATBRD");
    EXPECT_EQ(traitsOf(""), common + "ATBRD");
    EXPECT_EQ(traitsOf("Diamex DXM v1.2"), "AT!01 AT!00 ATN AT!10 ATP ATPA = ATBRD");
}

TEST(ElmFamily, TraitsOfANameWithTwoWordsComeFromBoth)
{
    EXPECT_EQ(traitsOf("ELM327 by Diamex v1.5"), traitsOf("Diamex"));
    EXPECT_EQ(traitsOf("ELM327 OBDPros"), traitsOf("OBDPros"));
    EXPECT_EQ(traitsOf("OBDKEY OBDPROS"), traitsOf("OBDPros"));
    EXPECT_EQ(traitsOf("Diamex OBDPros"), "AT!01 AT!00 ATN AT!10 ATP ATPA = ATSCS");
}

TEST(ElmFamily, LiveAdapterIsToldByAWordOrByItsLength)
{
    for (char const* reply : {"ELM", "elm", "ELM327 v1.5", "OBDKEY", "DIAMEX", "OBDPRO", "PLXKIWI", "ABCDE", "     "}) {
        EXPECT_TRUE(obd::isInterfaceSupported(reply)) << reply;
    }
    for (char const* reply : {"", "A", "ABCD", "EL M"}) {
        EXPECT_FALSE(obd::isInterfaceSupported(reply)) << reply;
    }
}

} // namespace
