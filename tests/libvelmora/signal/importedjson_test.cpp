// All that comes of each form of JSON, as text: what is taken, refused and noted.
#include "libvelmora/signal/bitfield.h"
#include "libvelmora/signal/importing/wicanformula.h"
#include "libvelmora/signal/signalfile.h"
#include "tests/libvelmora/signal/importedtext.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <fstream>

using namespace velmora;

namespace {

struct ImportCase
{
    std::string document;
    char const* text;
};

void expectTexts(std::initializer_list<ImportCase> cases, SignalImport (*import)(std::string_view, std::string const&))
{
    for (ImportCase const& each : cases) {
        EXPECT_EQ(testsupport::importedText(import(each.document, "f")), each.text) << each.document;
    }
}

std::string obdbCommand(std::string const& members, std::string const& format = R"({"len": 8})")
{
    return R"({"commands": [{)" + members + R"(, "signals": [{"id": "A", "name": "a", "fmt": )" + format + "}]}]}";
}

std::string obdbFormat(std::string const& format)
{
    return obdbCommand(R"("cmd": {"01": "0C"})", format);
}

std::string wicanFile(std::string const& init, std::string const& pid, std::string const& expression)
{
    return R"({"init": ")" + init + R"(", "pids": [{"pid": ")" + pid + R"(", "parameters": {"Soc x": )" + expression +
           "}}]}";
}

std::string abrpFile(std::string const& members)
{
    return R"({"soc": {"equation": "A", "command": "2101", "ecu": "7E4", )" + members + "}}";
}

std::string formulaProblem(std::string const& expression, ReplyFrames frames, std::size_t echo)
{
    try {
        return fromFrameBytes(expression, frames, echo);
    } catch (FormulaError const& error) {
        return std::to_string(error.position()) + ": " + error.what();
    }
}

std::string importProblem(std::string const& text)
{
    try {
        return testsupport::importedText(importSignals(text, "f"));
    } catch (Error const& error) {
        return std::string(error.kind() == ErrorKind::WrongUse ? "" : "of another kind: ") + error.what() +
               (error.hints().empty() ? "" : " | " + error.hints().front());
    }
}

} // namespace

TEST(ImportedObdb, TakesRefusesAndNotesEachCommandWhole)
{
    expectTexts(
        {
            {obdbCommand(R"("hdr": "7E0", "cmd": {"22": "1E1C"}, "freq": "4", "tmo": "64", "fcm1": false)",
                         R"({"len": 8, "mul": 3, "div": "2", "add": -40, "unit": "volts", "min": -5, "max": "9.5"})"),
             R"(id = "A"; name = "a"; header = "7E0"; request = "221E1C"; formula = "A*3/2+-40"; unit = "V"; min = -5; )"
             "max = 9.5; precision = 2; rate = 0.25; timeout = 410; "},
            {R"({"commands": [{"hdr": "FC00", "cmd": {"22": "1E3D"}, "rax": "17fe007b", "pri": "17", "tst": "7B",
                 "fcm1": true, "din": "03", "freq": 0, "tmo": "6464",
                 "signals": [{"id": "b c", "fmt": {"bix": 8, "len": 1, "map": {"1": {"value": "ON"}, "x": {"value": "Y"},
                              "10": {"value": "V", "description": "D"}, "3": {}, "": {"value": "Z"}}}}]}]})",
             R"(id = "B_C"; name = "b c"; header = "17FC007B"; reply = "17FE007B"; )"
             R"(flow = { header = "17FC007B", data = "300000" }; request = "221E3D"; formula = "B>>7&1"; )"
             R"(values = { 1 = "ON", 10 = "D" }; precision = 0; enabled = false; )"
             R"(reason = "needs session 03, which is not opened"; )"},
            {obdbCommand(R"("hdr": "10F1", "cmd": {"22": "DDBC"}, "pri": "DA", "din": true)"),
             "refused f:1: a: header \"DA10F1F1\" is none whose reply could be told; "},
            {obdbCommand(R"("hdr": "DA10", "cmd": {"22": "DDBC"}, "din": true)"),
             R"(id = "A"; name = "a"; header = "18DA10F1"; request = "22DDBC"; formula = "A"; precision = 2; )"
             R"(enabled = false; reason = "needs a session of its own, which is not opened"; )"},
            {obdbCommand(R"("hdr": "6F1", "cmd": {"22": "DDBC"}, "eax": "07", "tst": "F1", "rax": "607")"),
             R"(id = "A"; name = "a"; header = "6F1"; reply = "607"; ext = "07"; tester = "F1"; request = "22DDBC"; )"
             R"(formula = "A"; precision = 2; )"},
            {obdbCommand(R"("hdr": "DA07", "cmd": {"22": "DDBC"}, "eax": "07")"),
             R"(id = "A"; name = "a"; header = "18DA07F1"; ext = "07"; request = "22DDBC"; formula = "A"; precision = 2; )"},
            {obdbCommand(R"("hdr": "DA07", "cmd": {"22": "DDBC"}, "eax": "0708")"),
             "refused f:1: a: its extended address is no byte; "},
            {obdbCommand(R"("hdr": "DA07", "cmd": {"22": "DDBC"}, "eax": "07", "tst": "F1F1")"),
             "refused f:1: a: its extended address is no byte; "},
            {obdbCommand(R"("hdr": "DA07", "cmd": {"22": "DDBC"}, "eax": "xx")"),
             "refused f:1: a: its extended address is no byte; "},
            {obdbCommand(R"("hdr": "726", "cmd": {"22": "DDBC"})"),
             R"(id = "A"; name = "a"; header = "726"; reply = "72E"; request = "22DDBC"; formula = "A"; precision = 2; )"
             R"(reason = "the reply identifier is assumed, not told by the file"; )"},
            {obdbCommand(R"("hdr": "726", "rax": "720", "cmd": {"22": "DDBC"})"),
             R"(id = "A"; name = "a"; header = "726"; reply = "720"; request = "22DDBC"; formula = "A"; precision = 2; )"},
            {obdbCommand(R"("hdr": "7FF", "cmd": {"22": "DDBC"})"),
             "refused f:1: a: header \"7FF\" is none whose reply could be told; "},
            {obdbCommand(R"("hdr": "726", "rax": "72", "cmd": {"22": "DDBC"})"),
             "refused f:1: a: reply \"72\" is no identifier; "},
            {obdbCommand(R"("hdr": "726", "rax": "72X", "cmd": {"22": "DDBC"})"),
             "refused f:1: a: reply \"72X\" is no identifier; "},
            {obdbCommand(R"("hdr": "726")"), "refused f:1: a: it names no request; "},
            {obdbCommand(R"("cmd": "220101")"), "refused f:1: a: it names no request; "},
            {obdbCommand(R"("cmd": {"22": "0101", "21": "01"})"), "refused f:1: a: it names no request; "},
            {obdbCommand(R"("cmd": {"22": 101})"), "refused f:1: a: it names no request; "},
            {obdbCommand(R"("cmd": {"22": "010"})"), "refused f:1: a: its request is not hexadecimal; "},
            {obdbCommand(R"("cmd": {"22": "01"})"), "refused f:1: a: service 22 wants 3 bytes, here are 2; "},
            {R"({"commands": [{"cmd": {"01": "0C"}}, {"cmd": {"2E": "0101"}, "signals": [{"id": "X"}, {"id": "Y"}]}]})",
             "refused f:2: X: service 2E writes into a module; refused f:2: Y: service 2E writes into a module; "},
        },
        importObdb);
}

TEST(ImportedObdb, ReadsFormatsWithinTheirBounds)
{
    std::string const front = R"(id = "A"; name = "a"; request = "010C"; formula = )";
    std::pair<char const*, std::string> const cases[] = {
        {"{}", "refused f:1: a: it names no bits; "},
        {R"({"len": 0})", "refused f:1: a: it names no bits; "},
        {R"({"len": 1})", front + R"("A>>7&1"; precision = 2; )"},
        {R"({"len": 48})", front + R"("((((A*256+B)*256+C)*256+D)*256+E)*256+F"; precision = 2; )"},
        {R"({"len": 49})", "refused f:1: a: a field of 49 bits has no form here; "},
        {R"({"len": 64})", "refused f:1: a: a field of 64 bits has no form here; "},
        {R"({"len": 65})", "refused f:1: a: it names no bits; "},
        {R"({"len": 32, "sign": true})", front + R"t("signed32(((A*256+B)*256+C)*256+D)"; precision = 2; )t"},
        {R"({"len": 33, "sign": true})", "refused f:1: a: a field of 33 bits has no form here; "},
        {R"({"len": 8, "sign": 1, "blsb": 1})", front + R"("A"; precision = 2; )"},
        {R"({"len": 5, "sign": true})", front + R"t("signed(A>>3&31, 5)"; precision = 2; )t"},
        {R"({"len": 8, "bix": -1})", "refused f:1: a: it names no bits; "},
        {R"({"len": 8, "bix": 5600})", front + R"("ZY"; precision = 2; )"},
        {R"({"len": 8, "bix": 5601})", "refused f:1: a: it names no bits; "},
        {R"({"len": 8, "bix": 4})", front + R"("A*256+B>>4&255"; precision = 2; )"},
        {R"({"len": 4, "bix": 4})", front + R"("A&15"; precision = 2; )"},
        {R"({"len": 16, "bix": 8, "blsb": true})", front + R"("C*256+B"; precision = 2; )"},
        {R"({"len": 4, "bix": 8, "blsb": true})",
         "refused f:1: a: a field with its lowest byte first must consist of whole bytes; "},
        {R"({"len": 8, "min": 1, "max": 1})", front + R"("A"; precision = 2; )"},
        {R"({"len": 8, "min": 1})", front + R"("A"; precision = 2; )"},
        {R"({"len": 8, "max": "x"})", front + R"("A"; precision = 2; )"},
        {R"({"len": 8, "nullmin": 1})",
         front + R"("A"; precision = 2; noted f:1: a: the values that stand for none are not left out; )"},
        {R"({"len": 8, "nullmax": 1})",
         front + R"("A"; precision = 2; noted f:1: a: the values that stand for none are not left out; )"},
    };
    for (auto const& [format, text] : cases) {
        EXPECT_EQ(testsupport::importedText(importObdb(obdbFormat(format), "f")), text) << format;
    }
    EXPECT_EQ(*wrongField({0, 0, false, false}), "a field of 0 bits has no form here");
}

TEST(ImportedWican, TakesRefusesAndNotesEachRequestWhole)
{
    expectTexts(
        {
            {wicanFile("ATSP6;ATSH7E4;ATCRA7EC;", "2201019", R"("B10/2")"),
             R"(id = "SOC_X"; name = "Soc x"; header = "7E4"; request = "220101"; formula = "E/2"; precision = 2; )"},
            {wicanFile("AT SH 7E4;AT CRA 7ED;1003;", "2201019", R"("B10")"),
             R"(id = "SOC_X"; name = "Soc x"; header = "7E4"; reply = "7ED"; request = "220101"; formula = "E"; )"
             R"(precision = 2; enabled = false; reason = "needs session 1003, which is not opened"; )"
             "noted f:1: Soc x: needs session 1003, which is not opened; "},
            {wicanFile("ATSH726;", "2201019", R"("B10")"),
             R"(id = "SOC_X"; name = "Soc x"; header = "726"; reply = "72E"; request = "220101"; formula = "E"; )"
             R"(precision = 2; reason = "the reply identifier is assumed, not told by the file"; )"
             "noted f:1: Soc x: the reply identifier is assumed, not told by the file; "},
            {wicanFile("ATSH726;ATCRA72E;", "2201019", R"("B10")"),
             R"(id = "SOC_X"; name = "Soc x"; header = "726"; reply = "72E"; request = "220101"; formula = "E"; )"
             R"(precision = 2; reason = "the reply identifier is assumed, not told by the file"; )"
             "noted f:1: Soc x: the reply identifier is assumed, not told by the file; "},
            {wicanFile("ATSH7FF;", "2201019", R"("B10")"),
             "refused f:1: Soc x: header \"7FF\" is none whose reply could be told; "},
            {wicanFile("ATSH6F1;ATCEA07;ATCEA;ATCRA607;", "21011", R"("B3")"),
             R"(id = "SOC_X"; name = "Soc x"; header = "6F1"; reply = "607"; request = "2101"; formula = "A"; )"
             "precision = 2; "},
            {wicanFile("", "010C1", R"("[B3:B4]/4")"),
             R"(id = "SOC_X"; name = "Soc x"; request = "010C"; formula = "(A*256+B)/4"; precision = 2; )"},
            {wicanFile("", "010C", R"("B9")"),
             R"(id = "SOC_X"; name = "Soc x"; request = "010C"; formula = "E"; precision = 2; )"},
            {wicanFile("", "010C", R"("B8")"),
             "refused f:1: Soc x: expression \"B8\": byte 8 of the frames is no data; "},
            {wicanFile("", "010C", R"("B7")"),
             "refused f:1: Soc x: whether its reply comes in one frame is not told, and "
             "its bytes are counted by that; "},
            {wicanFile("ATCEA07;", "010C1", R"("B3")"),
             "refused f:1: Soc x: with extended addresses it is not agreed how such files count bytes; "},
            {wicanFile("", "010X", R"("B3")"),
             "refused f:1: Soc x: it has no request in hexadecimal, or no expression; "},
            {wicanFile("", "010C1", "3"), "refused f:1: Soc x: it has no request in hexadecimal, or no expression; "},
            {wicanFile("", "04", R"("B3")"),
             "refused f:1: Soc x: service 04 clears trouble codes, which `velmora clear` "
             "does after asking; "},
            {wicanFile("", "010C1", R"("B3+")"),
             "refused f:1: Soc x: expression \"B3+\": the formula ends too early; "},
            {R"({"pids": [{"pid": "010C1"}, {"pid": "010D1", "parameters": {"V": "B3"}}, {"pid": "04", "parameters":
                {"X": "B3"}}]})",
             R"(id = "V"; name = "V"; request = "010D"; formula = "A"; precision = 2; )"
             "refused f:3: X: service 04 clears trouble codes, which `velmora clear` does after asking; "},
            {
                R"({"init": "ATSH7E0;", "pids": [{"pid": "010C1", "pid_init": "ATSH7E1;", "parameters": {"V": "B3"}},
                {"pid": "010D1", "parameters": {"W": "S3"}}]})",
                R"(id = "V"; name = "V"; header = "7E1"; request = "010C"; formula = "A"; precision = 2; )"
                R"t(id = "W"; name = "W"; header = "7E0"; request = "010D"; formula = "signed8(A)"; precision = 2; )t"},
        },
        importWican);
}

TEST(ImportedWican, PlacesBytesOfFramesInThePayload)
{
    std::string const order = "a range of bytes must stand in one frame, in rising order, with at most four";
    struct Case
    {
        char const* expression;
        ReplyFrames frames;
        std::size_t echo;
        std::string text;
    };
    Case const cases[] = {
        {"B1", ReplyFrames::One, 0, "A"},
        {"1+B0", ReplyFrames::One, 0, "2: byte 0 of the frames is no data"},
        {"B8", ReplyFrames::One, 0, "0: byte 8 of the frames is no data"},
        {"B2", ReplyFrames::One, 2, "0: byte 2 of the frames is no data"},
        {"B3", ReplyFrames::One, 2, "A"},
        {"B1", ReplyFrames::Several, 0, "0: byte 1 of the frames is no data"},
        {"B2", ReplyFrames::Several, 0, "A"},
        {"B7", ReplyFrames::Several, 0, "F"},
        {"B8", ReplyFrames::Several, 0, "0: byte 8 of the frames is no data"},
        {"B9", ReplyFrames::Several, 0, "G"},
        {"B15", ReplyFrames::Several, 0, "M"},
        {"B16", ReplyFrames::Several, 0, "0: byte 16 of the frames is no data"},
        {"B17", ReplyFrames::Several, 0, "N"},
        {"B5:0 + B5:7", ReplyFrames::Several, 3, "bit(A,0) + bit(A,7)"},
        {"[B9:B12]", ReplyFrames::Several, 0, "(((G*256+H)*256+I)*256+J)"},
        {"[B9:B9]", ReplyFrames::Several, 0, "G"},
        {"[S9:S10]", ReplyFrames::Several, 0, "signed((G*256+H),16)"},
        {"[S9:B11]", ReplyFrames::Several, 0, "signed(((G*256+H)*256+I),24)"},
        {"[B9:B13]", ReplyFrames::Several, 0, "0: " + order},
        {"2*[B10:B9]", ReplyFrames::Several, 0, "2: " + order},
        {"[B15:B17]", ReplyFrames::Several, 0, "0: " + order},
    };
    for (Case const& each : cases) {
        EXPECT_EQ(formulaProblem(each.expression, each.frames, each.echo), each.text) << each.expression;
    }
    EXPECT_EQ(formulaProblem(std::string(513, ' '), ReplyFrames::One, 0), "512: the formula is too long");
    EXPECT_EQ(formulaProblem(std::string(512, ' '), ReplyFrames::One, 0), std::string(512, ' '));
    EXPECT_EQ(highestFrameByte("B3 + [B9:B12] + S10:3"), 12U);
    EXPECT_EQ(highestFrameByte("B3 + S10:3"), 10U);
    EXPECT_EQ(highestFrameByte("1"), 0U);
}

TEST(ImportedAbrp, TakesRefusesAndNotesEachKeyWhole)
{
    std::string const front = R"(id = "SOC"; name = "soc"; header = "7E4"; request = "2101"; formula = "A"; )";
    std::string const plain = front + "precision = 2; ";
    std::string const ranged = front + "min = -1; max = 2.5; precision = 2; ";
    std::string const assumed =
        R"(id = "SOC"; name = "soc"; header = "726"; reply = "72E"; request = "2101"; )"
        R"(formula = "A"; precision = 2; reason = "the reply identifier is assumed, not told by )"
        R"(the file"; noted f:1: soc: the reply identifier is assumed, not told by the file; )";
    std::string const switched = front +
                                 R"(precision = 2; enabled = false; reason = "needs session 10C0, which is not )"
                                 R"(opened"; noted f:2: soc: needs session 10C0, which is not opened; )";
    std::string const logical = front + R"(values = { 0 = "no", 1 = "yes" }; precision = 0; )";
    expectTexts(
        {
            {abrpFile(R"("minValue": "-1", "maxValue": 2.5)"), ranged.c_str()},
            {abrpFile(R"("minValue": 1, "maxValue": 1, "type": "Number")"), plain.c_str()},
            {abrpFile(R"("maxValue": 1)"), plain.c_str()},
            {abrpFile(R"("type": "Boolean")"), logical.c_str()},
            {abrpFile(R"("ecu": "726")"), assumed.c_str()},
            {abrpFile(R"("ecu": "7FF")"), "refused f:1: soc: its header is none whose reply could be told; "},
            {abrpFile(R"("command": "21x1")"), "refused f:1: soc: its request is not hexadecimal; "},
            {abrpFile(R"("command": "1101")"), "refused f:1: soc: service 11 resets a module; "},
            {abrpFile(R"("equation": "A>1")"),
             "refused f:1: soc: equation: comparisons mean different things in different "
             "versions of the apps; "},
            {R"({"data_commands": {"command": ["ATSH7E0", 5, "10C0", "100"]},
                 "soc": {"equation": "A", "command": "2101", "ecu": "7E4"}})",
             switched.c_str()},
            {R"({"a": {"equation": "A", "command": "2101"}, "init_commands": {"command": ["AT CAF0"]}})",
             "refused f:1: a: its file asks with whole frames (CAF0), which count other bytes; "},
            {R"({"a": {"equation": "A", "command": "2101"}, "init_commands": {"command": ["ATCAF0"]}})",
             "refused f:1: a: its file asks with whole frames (CAF0), which count other bytes; "},
            {"[1]", ""},
        },
        importAbrp);
}

TEST(ImportedSignals, SaysWhatATextIsThatHasNoKnownForm)
{
    for (char const* const text : {"\xEF\xBB\xBF{\"other\": 1}", "\t\r\n {\"other\": {\"equation\": null}}"}) {
        EXPECT_EQ(importProblem(text),
                  "f is JSON of a form that is not known | known are OBDb signal sets, WiCAN vehicle "
                  "profiles and ABRP requests");
    }
    EXPECT_TRUE(importProblem("{").starts_with("f is no JSON: ")) << importProblem("{");
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("a.csv")) << "A,a,2101,A,0,1,V,";
    EXPECT_EQ(importSignalFile(folder.file("a.csv")).file.path, folder.file("a.csv"));
}
