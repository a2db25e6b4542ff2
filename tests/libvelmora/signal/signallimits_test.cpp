// Signal files and imports at the limits of what they may hold.
#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/signal/importing/csvcolumns.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/importing/jsonsource.h"
#include "libvelmora/signal/importing/wicanformula.h"
#include "libvelmora/signal/readingonly.h"
#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/signal/signalset.h"
#include "tests/libvelmora/signal/importedtext.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

using namespace velmora;

namespace {

// The first mistake of a file with these signals, or of one signal with these further lines.
std::string firstMistake(std::string const& signals)
{
    SignalFileReading const reading = readSignals(signals, "f");
    return reading.mistakes.empty() ? "none" : toText(reading.mistakes.front(), "f");
}

std::string firstMistakeOf(std::string const& lines, std::string const& id = "A")
{
    return firstMistake("[[signal]]\nid = \"" + id + "\"\nname = \"a\"\nrequest = \"22 01 01\"\nformula = \"A\"\n" +
                        lines);
}

Signal signalWith(std::string const& line)
{
    return readSignals("[[signal]]\nid = \"A\"\nname = \"a\"\nrequest = \"22 01 01\"\n" + line + "\n", "f")
        .file.signals.at(0);
}

std::string obdbText(std::string const& format, std::string const& members = R"("cmd": {"01": "0C"})")
{
    return testsupport::importedText(
        importObdb(R"({"commands": [{)" + members + R"(, "signals": [{"id": "A", "fmt": )" + format + "}]}]}", "f"));
}

} // namespace

TEST(SignalLimits, HexadecimalTextsMayHaveBlanksOnly)
{
    using HexBytes = std::vector<unsigned char>;
    EXPECT_EQ(hexBytes("22 01 aF 9"), std::nullopt) << "half a byte";
    EXPECT_EQ(hexBytes(" 22 0 1aF "), (HexBytes{0x22, 0x01, 0xAF}));
    EXPECT_EQ(hexBytes(""), HexBytes());
    EXPECT_EQ(hexBytes("2G"), std::nullopt);
    EXPECT_EQ(hexBytes("2\t2"), std::nullopt);
    EXPECT_EQ(hexDigits("0 1 2 3456789aBcDeF"), "0123456789ABCDEF");
    EXPECT_EQ(hexText({0x00, 0x9F, 0xF9, 0xFF}), "009FF9FF");
    EXPECT_EQ(signalWith("formula = \"A\"").request, (HexBytes{0x22, 0x01, 0x01}));
}

TEST(SignalLimits, RepliesRepeatServiceAndIdentifier)
{
    for (unsigned int const service : {0x01U, 0x06U, 0x09U, 0x1AU, 0x21U}) {
        std::vector<unsigned char> const request{static_cast<unsigned char>(service), 1};
        EXPECT_EQ(echoLength(request), 2U) << service;
        EXPECT_EQ(echoLength({request[0], 1, 2, 3}), 2U) << service;
        EXPECT_EQ(refusalOf(request), std::nullopt);
    }
    for (unsigned int const service : {0x02U, 0x05U, 0x22U}) {
        std::vector<unsigned char> const request{static_cast<unsigned char>(service), 1, 2};
        EXPECT_EQ(echoLength(request), 3U) << service;
        EXPECT_EQ(echoLength({request[0], 1}), 3U) << service;
        EXPECT_EQ(refusalOf(request), std::nullopt);
    }
    EXPECT_EQ(echoLength({}), 0U);
    EXPECT_EQ(echoLength({0x03}), 1U);
    EXPECT_EQ(refusalOf({0x22, 1, 2, 3, 4}), "service 22 wants 3 bytes, here are 5") << "one identifier a signal";
    EXPECT_EQ(refusalFor({0x22, 1, 2, 3, 4}, RequestPurpose::Signal), std::nullopt);
    EXPECT_EQ(refusalFor({0x22}, RequestPurpose::Signal), "service 22 wants 3 bytes, here are 1");
    EXPECT_EQ(refusalFor({0x01, 2, 3, 4, 5}, RequestPurpose::Signal), "service 01 wants 2 bytes, here are 5");
    EXPECT_NE(refusalFor({0x3E, 0, 0}, RequestPurpose::Presence), std::nullopt);
    for (char const* const header : {"7E10F1", "18DB33F1", "18DA10AAF1", "18DA10F2", "7F0", "6E0"}) {
        EXPECT_EQ(standardReply(header), std::nullopt) << header;
    }
}

TEST(SignalLimits, MistakesAreTracedToWhereTheyStand)
{
    EXPECT_EQ(toText(SignalMistake{0, "key", "what"}, "p"), "p: key: what");
    EXPECT_EQ(toText(SignalMistake{1, "", "what"}, "p"), "p:1: what");
    std::string const letters = "f:2: signal 1, id: must be a text of capitals, digits and '_'";
    for (std::string const& id : {std::string("AZ_09"), std::string(64, 'A')}) {
        EXPECT_EQ(firstMistakeOf("", id), "none") << id;
    }
    for (std::string const& id : {std::string(65, 'A'), std::string("A@"), std::string("A["), std::string("A/"),
                                  std::string("A:"), std::string("A`"), std::string()}) {
        EXPECT_EQ(firstMistakeOf("", id), letters) << id;
    }
    EXPECT_EQ(firstMistakeOf("values = { \"\" = \"a\" }"),
              "f:6: signal 1, values: \"\" must be a whole number with a text");
    std::string const flow =
        "f:6: signal 1, flow: must be { header = \"7B3\", data = \"300000\" }, with one to five bytes";
    EXPECT_EQ(firstMistakeOf("flow = { header = \"XYZ\", data = \"30\" }"), flow);
    EXPECT_EQ(firstMistakeOf("flow = { header = \"7B3\", data = \"3X\" }"), flow);
    EXPECT_EQ(firstMistakeOf("min = -1e308\nmax = 1e308"), "none");
    EXPECT_EQ(firstMistakeOf("min = nan"), "f:6: signal 1, min: must be a number");
    EXPECT_EQ(firstMistake("[[signal]]\nid = \"T\"\nname = \"t\"\nrequest = \"2101\"\ntext = { first = 0 }\n"
                           "[[signal]]\nid = \"S\"\nname = \"s\"\nformula = \"value(\\\"T\\\")\"\n"),
              "f:6: S, formula: it reads a signal that is not in this file, or itself in a circle")
        << "a text is no number";
    EXPECT_EQ(readSignals("x = ", "f").file.path, "f");
    EXPECT_EQ(signalWith("formula = \"A\"\nvalues = { 10 = \"x\" }").values.begin()->first, 10);
    Signal const text = signalWith("text = { first = 3 }");
    EXPECT_EQ(text.text->first, 3U);
    EXPECT_EQ(text.text->count, 0U) << "to the end";
    EXPECT_TRUE(text.enabled);
    EXPECT_EQ(text.precision, 2);
    EXPECT_EQ(SignalText().first, 0U);
    EXPECT_EQ(SignalText().count, 0U);
}

TEST(SignalLimits, FilesHaveSixteenMebibytesAtMost)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("large.toml")) << "";
    std::filesystem::resize_file(folder.file("large.toml"), 16U << 20U);
    EXPECT_EQ(readSignalText(folder.file("large.toml")).size(), 16U << 20U);
    std::filesystem::resize_file(folder.file("large.toml"), (16U << 20U) + 1);
    try {
        readSignalText(folder.file("large.toml"));
        ADD_FAILURE() << "it was read";
    } catch (Error const& error) {
        EXPECT_EQ(error.what(), folder.file("large.toml") + " is larger than 16 MiB, which no signal file is");
    }
}

TEST(SignalLimits, FilesOfTheFolderAreReadByTheirNames)
{
    testsupport::TemporaryFolder const folder;
    std::string wanted;
    for (char each = 'A'; each <= 'P'; ++each) {
        char const other = static_cast<char>('A' + (each - 'A') * 5 % 16); // in another order than that of the names
        std::ofstream(folder.file(std::string(1, other) + ".toml"))
            << "[[signal]]\nid = \"" << other << "\"\nname = \"x\"\nformula = \"1\"\n";
        wanted += each;
    }
    SignalSet const set({}, folder.path(), nullptr);
    std::string found;
    for (std::size_t i = 0; i < 16; ++i) {
        found += set[i].signal.id;
    }
    EXPECT_EQ(found, wanted);
    EXPECT_EQ(set.search("nothing of the kind").size(), 0U);
    EXPECT_EQ(set.search("x").size(), 16U);
    SignalSet const builtIns;
    EXPECT_EQ(builtIns.find("81").front(), 0U) << "the very first definition is found by its PID, too";
    EXPECT_EQ(builtIns.find("81").size(), 10U);
    EXPECT_TRUE(builtIns.search("time").empty()) << "which is for signals of one's own";
}

TEST(SignalLimits, BuiltInStatesAreTexts)
{
    using States = std::map<long, std::string>;
    std::map<std::string, States> states;
    for (BuiltinPid const& each : builtinPids()) {
        if (!each.signal.values.empty()) {
            states[each.signal.id] = each.signal.values;
        }
    }
    EXPECT_EQ(states, (std::map<std::string, States>{
                          {"HV_MODE", {{0, "sustaining"}, {1, "depleting"}}},
                          {"HV_MODE_ENHANCED", {{0, "sustaining"}, {1, "depleting"}, {2, "increasing"}}}}));
    EXPECT_EQ(builtinPids().front().pid, 0x81);
    EXPECT_EQ(builtinPids().front().length, 41U);
    EXPECT_EQ(standingWord(builtinPids().front().standing), "one source");
}

TEST(SignalLimits, NumbersOfDocumentsAreFinite)
{
    nlohmann::json const document = nlohmann::json::parse(
        R"({"a": 1.5, "b": "-2.5", "c": "inf", "d": "nan", "e": "1x", "f": "", "g": [], "h": "1e400", "i": " 1"})");
    EXPECT_EQ(numberOf(document, "a"), 1.5);
    EXPECT_EQ(numberOf(document, "b"), -2.5);
    for (char const* const key : {"c", "d", "e", "f", "g", "h", "i", "j"}) {
        EXPECT_EQ(numberOf(document, key), std::nullopt) << key;
    }
    EXPECT_EQ(numberOf(document["g"], "a"), std::nullopt);
    EXPECT_EQ(obdbText(R"({"len": "nan"})"), "refused f:1: A: it names no bits; ");
    EXPECT_EQ(obdbText(R"({"len": 8, "mul": "inf"})"), "refused f:1: A: its mul is no number; ");
    EXPECT_EQ(obdbText(R"({"len": 8, "div": "x"})"), "refused f:1: A: its div is no number; ");
    EXPECT_EQ(obdbText(R"({"len": 8, "add": true})"), "refused f:1: A: its add is no number; ");
    EXPECT_EQ(obdbText(R"({"len": 8, "bix": "y"})"), "refused f:1: A: its bix is no number; ")
        << "not the first bits in their place";
    EXPECT_EQ(obdbText(R"({"len": 8, "bix": 0})"),
              R"(id = "A"; name = "A"; request = "010C"; formula = "A"; precision = 2; )");
    EXPECT_EQ(obdbText(R"({"len": 8})", R"("cmd": {"01": "0C"}, "fcm1": 1)"),
              R"(id = "A"; name = "A"; request = "010C"; formula = "A"; precision = 2; )");
    EXPECT_EQ(obdbText(R"({"len": 8})", R"("hdr": "DA07", "eax": "07", "tst": "7B", "cmd": {"22": "DDBC"})"),
              R"(id = "A"; name = "A"; header = "18DA07F1"; ext = "07"; tester = "7B"; request = "22DDBC"; )"
              R"(formula = "A"; precision = 2; )")
        << "behind an address byte the tester's is no part of the header";
}

TEST(SignalLimits, ImportsTakeOnlyWhatIsThere)
{
    EXPECT_EQ(highestFrameByte("B9"), 9U);
    std::string const file = R"(", "pids": [{"pid": "010C1", "parameters": {"V": "B3"}}]})";
    std::string const plain = R"(id = "V"; name = "V"; request = "010C"; formula = "A"; precision = 2; )";
    EXPECT_EQ(testsupport::importedText(importWican(R"({"init": ")" + std::string(4096, ' ') + "ATSH7E4;" + file, "f")),
              plain)
        << "set-ups longer than that are no set-ups";
    EXPECT_EQ(testsupport::importedText(importWican(R"({"init": ")" + std::string(4088, ' ') + "ATSH7E4;" + file, "f")),
              R"(id = "V"; name = "V"; header = "7E4"; request = "010C"; formula = "A"; precision = 2; )");
    EXPECT_EQ(testsupport::importedText(importAbrp(R"({"init_commands": {"command": ["2101", "1003 00"]},
                                                       "V": {"equation": "A", "command": "010C"}})",
                                                   "f")),
              plain)
        << "only a request of four digits opens a session";
    EXPECT_THROW(importSignals("", "f"), Error);
    EXPECT_THROW(importSignals(" \n", "f"), Error);
    EXPECT_EQ(ImportCollector("f").newId("(x)"), "X");
    EXPECT_EQ(testsupport::importedText(importSignalCsv("A,a,2101,A", "f")),
              R"(id = "A"; name = "A"; request = "2101"; formula = "A"; precision = 2; )")
        << "a row may end early";
    EXPECT_EQ(testsupport::importedText(importSignalCsv("A,a,,val{Z},0,1,,\nB,b,2101,A+,0,1,,\n", "f")),
              "refused f:1: A: its formula reads a value that is not in this file, or its own; "
              "refused f:2: B: equation \"A+\": the formula ends too early (at character 3); ")
        << "in the order of the file, though the first is found out last";
    EXPECT_EQ(numberCell("inf"), std::nullopt);
    EXPECT_EQ(numberCell("1e3"), 1000.0);
}
