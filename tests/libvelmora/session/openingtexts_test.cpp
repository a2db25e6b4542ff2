// What a person is told when a connection did not come about, whole, and what it is told by.
#include "libvelmora/session/openingfailure.h"
#include "libvelmora/session/openingwatch.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using velmora::Error;
using velmora::ErrorKind;
using velmora::OpeningWatch;

std::vector<unsigned char> toBytes(std::string const& text)
{
    return {text.begin(), text.end()};
}

TEST(OpeningTexts, AdviseByTheKindOfPort)
{
    std::string const right = "is it the right port?";
    std::string const plug = "pull the adapter and plug it in again, or try --reset";
    std::string const which = "is it the adapter? `velmora ports` lists Bluetooth devices by name";
    std::string const rate = "a serial adapter may use another line rate: try --baud 9600 or 115200";
    std::string const taken = "is another program connected to the adapter? most take one at a time";
    OpeningWatch const nothing;
    for (auto const& [port, hints] :
         {std::pair<char const*, std::vector<std::string>>{"/dev/ttyUSB0", {right, rate, plug}},
          {"10.0.0.1:35000", {right, taken, plug}},
          {"bt://00:1D:A5:68:98:8B", {right, which, plug}},
          {"ble://00:1D:A5:68:98:8B", {right, which, plug}},
          {"sim:", {right, plug}}}) {
        Error const error =
            velmora::openingfailure::silentAdapter("P", velmora::parsePortAddress(port, 38400), nothing);
        EXPECT_EQ(error.hints(), hints) << port;
        EXPECT_EQ(error.kind(), ErrorKind::AdapterSilent);
    }
    EXPECT_THAT(velmora::openingfailure::silentAdapter("P", std::nullopt, nothing).hints(), ElementsAre(right, plug));
}

TEST(OpeningTexts, TellWhatWorkedAndWhatDidNot)
{
    OpeningWatch watch;
    watch.onDataSent(toBytes("ATI\r"));
    watch.onDataReceived(toBytes("ELM327 v1.5\r\r>"));
    Error const later = velmora::openingfailure::silentAdapter("P", std::nullopt, watch);
    EXPECT_STREQ(later.what(), "ELM327 v1.5 answered on P, but not to what followed in time");
    EXPECT_EQ(later.hints().size(), 2U);
    Error const gone = velmora::openingfailure::goneAdapter("P", std::nullopt, watch);
    EXPECT_THAT(gone.hints(),
                ElementsAre("is it still in its socket, and in reach?", "pull the adapter and plug it in again"));
    Error const headers = velmora::openingfailure::headersMissing("ELM327 v1.5", "P");
    EXPECT_STREQ(headers.what(),
                 "The adapter (ELM327 v1.5) on P works and replies came, but they could not be read: no headers");
    EXPECT_EQ(headers.kind(), ErrorKind::VehicleSilent);
    Error const resets = velmora::openingfailure::resettingAdapter("P");
    EXPECT_STREQ(resets.what(), "The adapter on P resets itself again and again");
    EXPECT_EQ(resets.kind(), ErrorKind::LinkLost);
    Error const trouble = velmora::openingfailure::silentVehicle("A", "P", "BUS ERROR");
    ASSERT_EQ(trouble.hints().size(), 4U);
    EXPECT_EQ(trouble.hints()[0], "is the ignition on?");
    EXPECT_EQ(trouble.hints()[1], "does the wiring hold, and is nothing else plugged into the car's bus?");
}

TEST(OpeningTexts, FollowTheDialogue)
{
    OpeningWatch watch;
    EXPECT_EQ(watch.unanswered(), "");
    for (auto const& [command, phase] : {std::pair("ATTP", ""),
                                         {"ATSP", ""},
                                         {"ATSP00", "Searching for the bus"},
                                         {"ATTP 6", "Trying protocol 6"},
                                         {"ATSP0", "Searching for the bus"},
                                         {"ATE0", "Searching for the bus"},
                                         {"ATTPA6", "Trying protocol A6"}}) {
        watch.onDataSent(toBytes(std::string(command) + "\r"));
        EXPECT_EQ(watch.phase(), phase) << command;
    }
    watch.onDataReceived(toBytes("?\r\r>"));
    EXPECT_EQ(watch.unanswered(), "");
    watch.onDataSent(toBytes("\r"));
    EXPECT_EQ(watch.unanswered(), "") << "an empty line is no command";
    EXPECT_EQ(watch.identification(), "") << "nobody asked";
    watch.onDataSent(toBytes("0100\r"));
    watch.onDataReceived(toBytes("4100BE3FA813\r\r>"));
    EXPECT_TRUE(watch.headersMissing());
    watch.onDataSent(toBytes("0100\r"));
    watch.onDataReceived(toBytes("7E8064100BE3FA813\r\r>"));
    EXPECT_TRUE(watch.headersMissing()) << "once is enough";
}

} // namespace
