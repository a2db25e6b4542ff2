// The ends of what the simulator takes and keeps, and the times of its adapters, to the microsecond.
#include "simulator/bytes.h"
#include "simulator/car/course.h"
#include "simulator/error.h"
#include "simulator/requestlog.h"
#include "simulator/textfile.h"
#include "tests/simulator/conversation.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

namespace {

using obdsim::Ms;
using obdsim::Time;
using std::chrono::microseconds;

TEST(Limits, oneOfAllCharactersIsADigitABlankOrALetter)
{
    std::string const digits = "0123456789ABCDEFabcdef";
    std::string const blanks = " \t\n\v\f\r";
    for (int code = 0; code < 256; ++code) {
        char const character = static_cast<char>(code);
        std::string const text(1, character);
        bool const isDigit = code != 0 && digits.find(character) != std::string::npos;
        EXPECT_EQ(obdsim::isHexDigit(character), isDigit) << code;
        bool const isBlank = code != 0 && blanks.find(character) != std::string::npos;
        bool const isSmall = code >= 'a' && code <= 'z';
        std::string const kept = isSmall ? std::string(1, static_cast<char>(code - 'a' + 'A')) : text;
        EXPECT_EQ(obdsim::normaliseCommand(text), isBlank ? "" : kept) << code;
        if (isDigit) {
            unsigned int const value = static_cast<unsigned int>(std::stoi(text, nullptr, 16));
            EXPECT_EQ(obdsim::parseHexNumber(text), value);
            EXPECT_EQ(obdsim::parseHex(text + "0"), obdsim::Bytes{static_cast<std::uint8_t>(value << 4)});
        }
    }
    EXPECT_EQ(obdsim::hexNumber(0xFEDCBA98, 2), "FEDCBA98") << "as many digits as it needs";
}

TEST(Limits, theLastThousandRequestsAreKept)
{
    obdsim::RequestLog log;
    for (int i = 0; i < 1001; ++i) {
        log.add(Time(i), "R" + std::to_string(i));
    }
    EXPECT_EQ(log.entries().size(), 1000U);
    EXPECT_EQ(log.entries().front().text, "R1");
    EXPECT_EQ(log.entries().back().time, Time(1000));
    EXPECT_EQ(log.counts().size(), 1000U);
    EXPECT_EQ(log.counts().count("R1000"), 0U) << "the first different ones are counted";
    log.add(Time(0), "R5");
    EXPECT_EQ(log.counts().at("R5"), 2U);
    EXPECT_EQ(log.total(), 1002U);
}

TEST(Limits, aFileThatIsTooLargeIsToldInMebibytes)
{
    std::string const path = testsupport::ownPath("large");
    std::ofstream(path) << "x";
    std::filesystem::resize_file(path, (3U << 20U) + 1);
    EXPECT_EQ(obdsim::whyNoText(path, 3U << 20U), "it is larger than 3 MiB");
    EXPECT_EQ(obdsim::whyNoText(path, (3U << 20U) + 1), "it may not be read");
    std::filesystem::remove(path);
    try {
        obdsim::loadDrive("/nonexistent.csv");
        ADD_FAILURE();
    } catch (obdsim::SimulatorError const& error) {
        EXPECT_STREQ(error.what(), "no drive and no readable file \"/nonexistent.csv\"; the drives are town, motorway, "
                                   "cold-start");
    }
}

TEST(Limits, aLineOfTheHostHas254Characters)
{
    auto host = unplugged();
    host.ask("ATE0");
    std::string const blanks(254 - 3, ' ');
    EXPECT_EQ(host.ask("ATI" + blanks), "ELM327 v1.5\r\r>");
    EXPECT_EQ(host.ask("ATI" + blanks + " "), "?\r\r>");
    EXPECT_EQ(host.ask("ATI" + blanks + std::string(5000, ' ')), "?\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(Limits, anAdapterWithNothingPluggedInHasTheBatterysVolts)
{
    EXPECT_EQ(unplugged().ask({"ATE0", "ATRV"}), "12.2V\r\r>");
    EXPECT_EQ(unplugged().ask({"ATE0", "ATIGN"}), "ON\r\r>");
}

TEST(Limits, commandsThatWaitTellTheirTime)
{
    struct Wait
    {
        char const* command;
        Time time;
    };
    auto host = simulated("petrol-can11");
    host.ask("ATE0");
    for (auto const& each : {Wait{"ATI", Ms(4)}, Wait{"ATRV", Ms(4)}, Wait{"ATZ", Ms(804)}, Wait{"ATWS", Ms(6)},
                             Wait{"ATD", Ms(4)}, Wait{"ATSP6", Ms(34)}, Wait{"ATBRT10", Ms(4)},
                             Wait{"ATBRD23", Ms(4 + 10 + 16 * 5)}, Wait{"ATBRT00", Ms(4)}}) {
        host.ask(each.command);
        EXPECT_EQ(host.lastWait(), each.time) << each.command;
        host.ask("ATE0");
    }
    host.ask("ATLP");
    host.peer().receive("A");
    host.listen();
    EXPECT_EQ(host.lastWait(), Ms(4 + 100)) << "it wakes";
    host.ask("ATMA");
    host.peer().receive("A");
    host.listen();
    EXPECT_EQ(host.lastWait(), Ms(4)) << "it stops";
}

TEST(Limits, habitsHaveTheirTime)
{
    auto slow = unplugged("elm327-v1.5", {obdsim::Quirk::PromptSlow});
    slow.ask("ATI");
    EXPECT_EQ(slow.lastWait(), Ms(4 + 250));
    auto radio = unplugged("elm327-v1.5", {obdsim::Quirk::Greeting});
    EXPECT_EQ(radio.peer().nextOutput(), Ms(20));
}

TEST(Limits, aFiveBaudAddressTakesThePauseThatTheCarMakes)
{
    auto const wait = [](char const* pause) {
        auto host = withVehicle("name = \"K line\"\nprotocol = 3\nw4 = " + std::string(pause) +
                                "\n[[module]]\nid = \"11\"\n[module.raw]\n\"0100\" = \"41 00 BE 1F B8 10\"\n");
        host.ask({"ATE0", "ATSP3", "ATSI"});
        return host.lastWait();
    };
    EXPECT_EQ(wait("25"), Ms(4 + 2500));
    EXPECT_EQ(wait("50"), Ms(4 + 2525));
}

TEST(Limits, aLineTakesTenBitsForEachCharacter)
{
    auto host = simulated("petrol-can11", "elm327-v1.5", {"baud=9600"});
    host.ask("ATE0");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
    Time const expected = Ms(4) + microseconds(4 * 1'000'000 / 960 + 12 * 1'000'000 / 960 + 2 * 1'000'000 / 960);
    EXPECT_EQ(host.lastWait(), expected) << "four to the adapter, fourteen back";
}

TEST(Limits, aCourseGoesOnWhereItBegan)
{
    auto const course = obdsim::parseDrive("seconds,speed\n0,10\n10,30\n20,20\n", "a.csv").course;
    for (auto const& [second, kmh] :
         {std::pair{0.0, 10.0}, {2.5, 15.0}, {10.0, 30.0}, {12.5, 27.5}, {20.0, 10.0}, {30.0, 30.0}, {45.0, 20.0}}) {
        EXPECT_NEAR(course.kmh(second), kmh, 1e-9) << second;
    }
    EXPECT_NEAR(course.kilometres(2.5), 12.5 * 2.5 / 3600, 1e-12);
    EXPECT_NEAR(course.kilometres(12.5), (200 + 28.75 * 2.5) / 3600, 1e-12);
    EXPECT_NEAR(course.kilometres(60), 3 * (200.0 + 250) / 3600, 1e-12);
}

} // namespace
