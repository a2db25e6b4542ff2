// What each key of a signal may hold, with the message for what it may not.
#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalset.h"
#include "libvelmora/signal/standardpid.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <fstream>

using namespace velmora;

namespace {

std::string linesOfMistakes(std::string const& text)
{
    std::string list;
    for (SignalMistake const& each : readSignals(text, "f").mistakes) {
        list += toText(each, "f") + "\n";
    }
    return list;
}

// Of a signal that is sound but for some lines, which begin at line 4.
std::string mistakeOf(std::string const& lines)
{
    return linesOfMistakes("[[signal]]\nid = \"A\"\nname = \"a\"\n" + lines);
}

std::string const soundLines = "request = \"2101\"\nformula = \"A\"\n";

std::string keyMistake(std::string const& line)
{
    std::string const all = mistakeOf(line + "\n" + soundLines);
    std::string const front = "f:4: signal 1, " + line.substr(0, line.find(' ')) + ": ";
    return all.starts_with(front) && all.find('\n') + 1 == all.size()
               ? all.substr(front.size(), all.size() - front.size() - 1)
               : all;
}

} // namespace

TEST(SignalKeys, HoldWhatTheyMay)
{
    std::string const hex = "must be a text of hexadecimal digits, as many as one of ";
    std::string const text = "must be { first = BYTE, count = BYTES }, counted from 0 behind the echo";
    std::string const flow = "must be { header = \"7B3\", data = \"300000\" }, with one to five bytes";
    std::string const verified = "must be { by = \"who\", on = \"2026-03-01\" }";
    std::string const values = "must be a table of texts, such as { 0 = \"off\", 1 = \"on\" }";
    std::pair<char const*, std::string> const cases[] = {
        {"unit = \"\"", "must be a text that is not empty"},
        {"reason = 5", "must be a text that is not empty"},
        {"unit = \"V\"", ""},
        {"header = \"7E\"", hex + "3, 6, 8"},
        {"header = 7", hex + "3, 6, 8"},
        {"header = \"7E0\"", ""},
        {"header = \"8210F1\"\nreply = \"82F110\"", ""},
        {"header = \"18DA10F1\"", ""},
        {"reply = \"7E8X\"", hex + "3, 6, 8"},
        {"tester = \"F\"", hex + "2"},
        {"tester = \"F1\"", ""},
        {"length = 0", "must be a whole number from 1 to 702"},
        {"length = 1", ""},
        {"length = 702", ""},
        {"length = 703", "must be a whole number from 1 to 702"},
        {"length = 1.5", "must be a whole number from 1 to 702"},
        {"precision = -1", "must be a whole number from 0 to 9"},
        {"precision = 0", ""},
        {"precision = 9", ""},
        {"precision = 10", "must be a whole number from 0 to 9"},
        {"timeout = 7", "must be a whole number from 8 to 10000"},
        {"timeout = 8", ""},
        {"timeout = 10000", ""},
        {"timeout = 10001", "must be a whole number from 8 to 10000"},
        {"min = \"1\"", "must be a number"},
        {"max = inf", "must be a number"},
        {"max = 7", ""},
        {"min = -1e300", ""},
        {"rate = 0.0009", "must be a number of at least 0.001000"},
        {"rate = 0.001", ""},
        {"enabled = 1", "must be true or false"},
        {"enabled = false", ""},
        {"values = 1", values},
        {"values = {}", values},
        {"values = { 1x = \"a\" }", "\"1x\" must be a whole number with a text"},
        {"values = { 1 = 2 }", "\"1\" must be a whole number with a text"},
        {"values = { -1 = \"a\" }", ""},
        {"flow = 1", flow},
        {"flow = { header = \"7B\", data = \"300000\" }", flow},
        {"flow = { header = \"7B3\", data = \"\" }", flow},
        {"flow = { header = \"7B3\", data = \"300000000000\" }", flow},
        {"flow = { header = \"7B3\", data = \"300\" }", flow},
        {"flow = { header = \"7B3\", data = \"30\", more = 1 }", flow},
        {"flow = { header = \"7B3\", data = \"3000000000\" }", ""},
        {"flow = { header = \"8210F1\", data = \"30\" }", ""},
        {"flow = { header = \"18DA10F1\", data = \"30\" }", ""},
        {"verified = 1", verified},
        {"verified = { by = \"x\" }", verified},
        {"verified = { on = \"x\" }", verified},
        {"verified = { by = \"x\", on = \"y\", at = 1 }", verified},
        {"verified = { by = \"x\", on = \"y\" }", ""},
        {"colour = 1", "is no key of a signal"},
    };
    for (auto const& [line, wrong] : cases) {
        EXPECT_EQ(keyMistake(line), wrong) << line;
    }
    std::string const textual = "request = \"2101\"\n";
    for (char const* const good : {"{ first = 0 }", "{ first = 701, count = 702 }"}) {
        EXPECT_EQ(mistakeOf(textual + "text = " + good), "") << good;
    }
    for (char const* const bad :
         {"1", "{ count = 1 }", "{ first = -1 }", "{ first = 702 }", "{ first = 0, count = -1 }",
          "{ first = 0, count = 703 }", "{ first = 0, count = 1, more = 1 }"}) {
        EXPECT_EQ(mistakeOf(textual + "text = " + bad), "f:5: signal 1, text: " + text + "\n") << bad;
    }
}

TEST(SignalKeys, HoldTogetherWhatTheyMay)
{
    std::string const whole = "must be a text of whole bytes in hexadecimal, such as \"220101\"";
    std::string const circle = "A, formula: it reads a signal that is not in this file, or itself in a circle\n";
    std::pair<std::string, std::string> const cases[] = {
        {soundLines, ""},
        {"request = \"210\"\nformula = \"A\"", "f:4: signal 1, request: " + whole + "\n"},
        {"request = 21\nformula = \"A\"", "f:4: signal 1, request: " + whole + "\n"},
        {"request = \"22010\"\nformula = 1",
         "f:5: signal 1, formula: must be a text\nf:4: signal 1, request: " + whole + "\n"},
        {"request = \"2101\"\nformula = \"A+(\"",
         "f:5: signal 1, formula: the formula ends too early (at character 4)\n"},
        {"request = \"2101\"", "f:1: signal 1, formula: each signal wants either a formula or a text\n"},
        {soundLines + "text = { first = 0 }", "f:1: signal 1, formula: each signal wants either a formula or a text\n"},
        {"formula = \"A\"", "f:1: signal 1, request: is missing; only a formula of other signals' values needs none\n"},
        {"text = { first = 0 }",
         "f:1: signal 1, request: is missing; only a formula of other signals' values needs none\n"},
        {"formula = \"value(\\\"A\\\")\"", "f:1: " + circle},
        {"formula = \"value(\\\"B\\\")\"", "f:1: " + circle},
        {soundLines + "header = \"726\"",
         "f:1: signal 1, reply: is missing; only 7E0 to 7E7 and 18DAxxF1 have replies that "
         "follow from the header\n"},
        {soundLines + "ext = \"07\"", "f:1: signal 1, ext: needs a header\n"},
        {soundLines + "ext = \"07\"\nheader = \"7E0\"", ""},
        {soundLines + "min = 2\nmax = 2", "f:1: signal 1, min: must be less than max\n"},
        {soundLines + "min = 1.9\nmax = 2", ""},
    };
    for (auto const& [lines, wrong] : cases) {
        EXPECT_EQ(mistakeOf(lines), wrong) << lines;
    }
}

TEST(SignalKeys, StandInAFileOfTables)
{
    std::string const signal = "[[signal]]\nid = \"A\"\nname = \"a\"\n" + soundLines;
    std::string const known = "only maker and vin (texts) and models (a list of texts) are known here\n";
    std::pair<std::string, std::string> const cases[] = {
        {"", "f:1: there is no [[signal]] in it\n"},
        {"other = 1\n" + signal, "f:1: other: is no key of a signal file (vehicle, signal)\n"},
        {"signal = 1", "f:1: signal: must be a list of tables: [[signal]]\n"},
        {"signal = [1]", "f:1: signal: must be a list of tables: [[signal]]\n"},
        {"vehicle = 1\n" + signal, "f:1: vehicle: must be a table: [vehicle]\n"},
        {"[vehicle]\nmaker = 1\n" + signal, "f:2: vehicle, maker: " + known},
        {"[vehicle]\nvin = 1\n" + signal, "f:2: vehicle, vin: " + known},
        {"[vehicle]\nmodels = \"x\"\n" + signal, "f:2: vehicle, models: " + known},
        {"[vehicle]\nmodels = [1]\n" + signal, "f:2: vehicle, models: " + known},
        {"[vehicle]\nmodels = [\"x\", \"y\"]\nmaker = \"m\"\nvin = \"*\"\n" + signal, ""},
        {signal + signal, "f:6: signal 2, id: \"A\" is used twice\n"},
    };
    for (auto const& [text, wrong] : cases) {
        EXPECT_EQ(linesOfMistakes(text), wrong) << text;
    }
    EXPECT_TRUE(linesOfMistakes("x = ").starts_with("f:1: ")) << linesOfMistakes("x = ");
}

TEST(SignalKeys, AreAllWrittenAgain)
{
    std::string const text = R"([vehicle]
maker = "m \"q\" \\ \u0001\u007F"
models = ["x", "y"]
vin = "W?*"

[[signal]]
id = "A"
name = "a"
header = "6F1"
reply = "607"
ext = "07"
tester = "F1"
flow = { header = "6F1", data = "0730" }
request = "2101"
length = 3
formula = "A"
values = { -1 = "x", 2 = "y" }
unit = "V"
min = -0.5
max = 3
precision = 1
rate = 0.25
timeout = 50
enabled = false
reason = "r"
verified = { by = "b", on = "o" }

[[signal]]
id = "B"
name = "b"
request = "2101"
text = { first = 2, count = 4 }
precision = 2
)";
    SignalFileReading const reading = readSignals(text, "f");
    ASSERT_TRUE(reading.mistakes.empty()) << toText(reading.mistakes.front(), "f");
    EXPECT_EQ(toToml(reading.file), text);
    auto const json = [](char const* each) { return nlohmann::ordered_json::parse(each); };
    EXPECT_EQ(toJsonValue(reading.file)["vin"], "W?*");
    EXPECT_EQ(toJsonValue(reading.file)["file"], "f");
    EXPECT_EQ(toJsonValue(reading.file)["signals"], json(R"([
        {"id": "A", "name": "a", "header": "6F1", "reply": "607", "request": "2101", "formula": "A",
         "values": {"-1": "x", "2": "y"}, "unit": "V", "min": -0.5, "max": 3.0, "precision": 1, "rate": 0.25,
         "enabled": false, "reason": "r"},
        {"id": "B", "name": "b", "header": null, "reply": null, "request": "2101", "formula": null, "values": null,
         "unit": null, "min": null, "max": null, "precision": 2, "rate": null, "enabled": true, "reason": null}])"));
    EXPECT_EQ(toJsonValue(readSignals("", "f").file),
              json(R"({"file": "f", "maker": null, "vin": null, "signals": []})"));
}

TEST(SignalKeys, RefuseRequestsWithTheirReason)
{
    std::pair<std::vector<unsigned char>, std::string> const cases[] = {
        {{}, "the request is empty"},
        {{0x22, 1, 2, 3, 4, 5, 6, 7}, "a request has 7 bytes at most, here are 8"},
        {{0x22, 1, 2, 3, 4, 5, 6}, "service 22 wants 3 bytes, here are 7"},
        {{0x22, 1, 2, 3}, "service 22 wants 3 bytes, here are 4"},
        {{0x02, 5}, "service 02 wants 3 bytes, here are 2"},
        {{0x01, 5, 6}, "service 01 wants 2 bytes, here are 3"},
        {{0x03}, "service 03 reads trouble codes, which `velmora codes` does"},
        {{0x19, 2}, "service 19 reads trouble codes, which `velmora codes` does"},
        {{0x3E, 0}, "service 3E keeps a session open, which only the program itself does"},
        {{0x04}, "service 04 clears trouble codes, which `velmora clear` does after asking"},
        {{0x2A, 0}, "service 2A makes a module send on by itself"},
        {{0xAA, 0}, "service AA makes a module send on by itself"},
        {{0x77, 0}, "service 77 is none of those that only read (01, 02, 05, 06, 09, 1A, 21, 22)"},
    };
    for (auto const& [request, why] : cases) {
        EXPECT_EQ(refusalOf(request), why);
    }
    EXPECT_EQ(swappedReply("8210F1"), "82F110");
    EXPECT_EQ(swappedReply("DA10F1"), std::nullopt);
    EXPECT_EQ(swappedReply("8210F2"), std::nullopt);
    EXPECT_EQ(swappedReply("7E0"), std::nullopt);
    for (char const* const header : {"7DF", "18DB33F1", "DB33F1", "686AF1", "616AF1", "C233F1"}) {
        EXPECT_TRUE(isFunctionalHeader(header)) << header;
    }
    for (char const* const header : {"7E0", "18DA10F1", "8233F1", "C210F1", "C33F1", ""}) {
        EXPECT_FALSE(isFunctionalHeader(header)) << header;
    }
    EXPECT_EQ(echoLength({0x02, 5, 0}), 3U);
    EXPECT_EQ(echoLength({0x77, 5, 0, 1}), 4U);
}

TEST(SignalKeys, FindSignalsInASet)
{
    testsupport::TemporaryFolder const folder;
    std::string const first = "[vehicle]\nvin = \"W*\"\n[[signal]]\nid = \"OIL\"\nname = \"Gearbox oil hot\"\n" +
                              soundLines + "length = 4\n[[signal]]\nid = \"X\"\nname = \"Cold oil\"\n" + soundLines;
    std::ofstream(folder.file("one.toml")) << first;
    std::ofstream(folder.file("two.toml")) << "[[signal]]\nid = \"OIL\"\nname = \"Other\"\n" + soundLines;
    std::ofstream(folder.file("ignored.txt")) << "x";
    SignalSet const set({folder.file("two.toml")}, folder.path(), {});
    std::size_t const builtIns = builtinPids().size();
    ASSERT_EQ(set.entries().size(), builtIns + 4) << "one of the two named files lies in the folder as well";
    using Found = std::vector<std::size_t>;
    EXPECT_EQ(set.find("oil"), Found{0}) << "a named file goes first";
    EXPECT_EQ(set.find("GEARBOX oil hot"), Found{1});
    EXPECT_EQ(set.find("gearbox"), Found{});
    EXPECT_EQ(set.find(builtinPids()[0].signal.name), Found{4}) << "a built-in one by its whole name";
    EXPECT_EQ(set.search("OIL cold"), Found{2});
    EXPECT_EQ(set.search("oil"), (Found{1, 2}));
    EXPECT_EQ(set.search("oil warm"), Found{});
    EXPECT_EQ(set[1].vin, "W*");
    EXPECT_EQ(set[1].length, 4U);
    EXPECT_EQ(set[2].length, 0U);
    EXPECT_FALSE(set[1].isBuiltIn());
    EXPECT_TRUE(set[4].isBuiltIn());
    EXPECT_EQ(set.sibling(1, "X"), 2U);
    EXPECT_EQ(set.sibling(0, "X"), std::nullopt);
    EXPECT_EQ(set.sibling(4, "OIL"), std::nullopt);
    Found const odometer = set.find("A6");
    ASSERT_EQ(odometer.size(), 1U);
    EXPECT_EQ(set[odometer[0]].signal.request, (std::vector<unsigned char>{0x01, 0xA6}));
    for (char const* const word : {"a6", "01a6", "$A6", "0xa6", "$01A6", "0x01a6"}) {
        EXPECT_EQ(set.find(word), odometer) << word;
    }
    for (char const* const word : {"02A6", "1A6", "", "6"}) {
        EXPECT_EQ(set.find(word), Found{}) << word;
    }
    EXPECT_EQ(signalId(0), 0x10000);
    EXPECT_EQ(signalId(3), 0x10003);
    EXPECT_EQ(SignalSet::folderBesides("/a/b/settings.toml"), "/a/b/signals");
    for (SignalEntry const& each : set.entries()) {
        bool const marked = each.signal.name.ends_with(" (one source)");
        EXPECT_EQ(marked, each.standing == PidStanding::Listed) << each.signal.name;
        EXPECT_EQ(each.signal.reason == "one source", each.standing == PidStanding::Listed) << each.signal.name;
    }
}

TEST(SignalKeys, FitVehiclesByPatterns)
{
    std::pair<char const*, char const*> const fitting[] = {
        {"", "ANY"},           {"wvw*", "WVWZZZ"}, {"W?W*", "WVW"}, {"*ZZ*1", "WZZ01"}, {"**", ""},
        {"A*B*C", "AxxBxBxC"}, {"?", "x"},         {"*A?", "BAAC"}, {"abc", "ABC"}};
    for (auto const& [pattern, vin] : fitting) {
        EXPECT_TRUE(fitsVin(pattern, vin)) << pattern << " " << vin;
    }
    std::pair<char const*, char const*> const others[] = {{"WVW", "WVWZ"}, {"WVWZ", "WVW"}, {"?", ""},
                                                          {"*A", "BAB"},   {"A*B", "AC"},   {"A?", "A"},
                                                          {"B*", "AB"},    {"a*?b", "AB"},  {"AB*B?", "ABX"}};
    for (auto const& [pattern, vin] : others) {
        EXPECT_FALSE(fitsVin(pattern, vin)) << pattern << " " << vin;
    }
}

TEST(SignalKeys, DecodeStandardPidsAsSaeJ1979Does)
{
    struct Case
    {
        unsigned char pid;
        std::vector<unsigned char> data;
        double value;
        char const* unit;
        int precision;
    };
    Case const cases[] = {
        {0x04, {255}, 100, "%", 1},   {0x05, {40}, 0, "°C", 0},      {0x0B, {7}, 7, "kPa", 0},
        {0x0C, {1, 4}, 65, "rpm", 0}, {0x0D, {9}, 9, "km/h", 0},     {0x0E, {128}, 0, "°", 1},
        {0x0F, {41}, 1, "°C", 0},     {0x10, {1, 44}, 3, "g/s", 2},  {0x11, {51}, 20, "%", 1},
        {0x1F, {1, 2}, 258, "s", 0},  {0x21, {1, 2}, 258, "km", 0},  {0x2F, {51}, 20, "%", 1},
        {0x31, {1, 2}, 258, "km", 0}, {0x33, {7}, 7, "kPa", 0},      {0x42, {0x30, 0xD4}, 12.5, "V", 2},
        {0x45, {51}, 20, "%", 1},     {0x46, {41}, 1, "°C", 0},      {0x5B, {51}, 20, "%", 1},
        {0x5C, {41}, 1, "°C", 0},     {0x5E, {1, 44}, 15, "l/h", 2},
    };
    for (Case const& each : cases) {
        auto const signal = standardPidSignal(each.pid);
        ASSERT_TRUE(signal) << int{each.pid};
        EXPECT_EQ(evaluate(*signal->formula, {each.data, {}}), each.value) << signal->name;
        EXPECT_EQ(signal->unit, each.unit);
        EXPECT_EQ(signal->precision, each.precision);
        EXPECT_EQ(signal->request, (std::vector<unsigned char>{0x01, each.pid}));
    }
    EXPECT_FALSE(standardPidSignal(0x03));
    EXPECT_FALSE(standardPidSignal(0x06));
    EXPECT_FALSE(standardPidSignal(0xFF));
}
