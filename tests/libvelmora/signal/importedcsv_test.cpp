// All that comes of each kind of row, as text: what is taken, refused and noted.
#include "libvelmora/signal/importing/csvcolumns.h"
#include "libvelmora/signal/importing/csvtable.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/signalfile.h"
#include "tests/libvelmora/signal/importedtext.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

using namespace velmora;

namespace {

std::string csvText(std::string const& rows)
{
    return testsupport::importedText(importSignalCsv(rows, "f"));
}

std::string csvError(std::string const& rows)
{
    try {
        return csvText(rows);
    } catch (Error const& error) {
        return std::string(error.kind() == ErrorKind::WrongUse ? "" : "of another kind: ") + error.what() + " | " +
               (error.hints().empty() ? "" : error.hints().front());
    }
}

} // namespace

TEST(ImportedCsv, TakesRefusesAndNotesEachRowWhole)
{
    struct Case
    {
        char const* rows;
        char const* text;
    };
    Case const cases[] = {
        {"A,a,2101,A,0,1,V,7E4",
         R"(id = "A"; name = "A"; header = "7E4"; request = "2101"; formula = "A"; unit = "V"; )"
         "min = 0; max = 1; precision = 2; "},
        {"Long  name (°C)!,a,0X22 01 01,A,0,1,,",
         R"(id = "LONG_NAME_C"; name = "Long  name (°C)!"; request = "220101"; formula = "A"; min = 0; max = 1; )"
         "precision = 2; "},
        {"(),a,2101,A,0,1,,", R"t(id = "SIGNAL"; name = "()"; request = "2101"; formula = "A"; min = 0; max = 1; )t"
                              "precision = 2; "},
        {"Name,ModeAndPID,Equation\nA,2101,B",
         R"(id = "A"; name = "A"; request = "2101"; formula = "B"; precision = 2; )"},
        {"name, SHORTNAME,Mode And PID ,Equation,Colour,,Units\nA,a,2101,B,red,x,kph",
         R"(id = "A"; name = "A"; request = "2101"; formula = "B"; unit = "km/h"; precision = 2; )"
         "noted f:1: column Colour: is not known and was left out; "},
        {"Name,ModeAndPID,Equation,StartDiagnostic,StopDiagnostic,Scale,MinimumRefreshDelayMillis\n"
         "A,2101,B,10C0,1081,0.5,400\nB,2102,A,,,1,0\nC,2103,A,,,,x",
         R"(id = "A"; name = "A"; request = "2101"; formula = "B*0.5"; precision = 2; rate = 2.5; enabled = false; )"
         R"(reason = "needs session 10C0, which is not opened"; )"
         R"(id = "B"; name = "B"; request = "2102"; formula = "A"; precision = 2; )"
         R"(id = "C"; name = "C"; request = "2103"; formula = "A"; precision = 2; )"
         "noted f:2: A: needs session 10C0, which is not opened; "},
        {"Name,ModeAndPID,Equation,Scale\nA,2101,B,x", R"(refused f:2: A: scale "x" is no number; )"},
        {"A,a,2101,A,9,1,V,\nB,b,2102,A,1,,V,\nC,c,2103,A,,1,V,\nD,d,2104,A,1,1,V,",
         R"(id = "A"; name = "A"; request = "2101"; formula = "A"; unit = "V"; min = 1; max = 9; precision = 2; )"
         R"(id = "B"; name = "B"; request = "2102"; formula = "A"; unit = "V"; precision = 2; )"
         R"(id = "C"; name = "C"; request = "2103"; formula = "A"; unit = "V"; precision = 2; )"
         R"(id = "D"; name = "D"; request = "2104"; formula = "A"; unit = "V"; precision = 2; )"
         "noted f:1: A: minimum and maximum were swapped; "},
        {"A,a,2101,A,0,1,,7F7\nB,b,2101,A,0,1,,7F8\nC,c,2101,A,0,1,,82 10 "
         "f1\nD,d,2101,A,0,1,,12345\nE,e,2101,A,0,1,,xyz",
         R"(id = "A"; name = "A"; header = "7F7"; reply = "7FF"; request = "2101"; formula = "A"; min = 0; max = 1; )"
         R"(precision = 2; reason = "the reply identifier is assumed, not told by the file"; )"
         R"(id = "C"; name = "C"; header = "8210F1"; reply = "82F110"; request = "2101"; formula = "A"; min = 0; )"
         R"(max = 1; precision = 2; reason = "the reply identifier is assumed, not told by the file"; )"
         R"(refused f:2: B: header "7F8" is none whose reply could be told; )"
         R"(refused f:4: D: header "12345" is none whose reply could be told; )"
         R"(refused f:5: E: header "xyz" is none whose reply could be told; )"
         "noted f:1: A: the reply identifier is assumed, not told by the file; "
         "noted f:3: C: the reply identifier is assumed, not told by the file; "},
        {"A,a,22XY,A,0,1,,\n,b,2101,A,0,1,,\nC,c,,A,0,1,,\nD,d,2101,A+*B,0,1,,\nE,e,2101,A+[71],0,1,,\n",
         R"(refused f:1: A: request "22XY" is not hexadecimal; )"
         "refused f:2: a row without a name: it has no name; "
         "refused f:3: C: it reads bytes, but has no request; "
         R"(refused f:4: D: equation "A+*B": "*" stands in the wrong place (at character 3); )"
         R"(refused f:5: E: equation "A+[71]": the value of PID [71] is not known here; )"},
        {"Power,P,220101,A*[0d],0,1,,7E4",
         R"(id = "PID_0D"; name = "Vehicle speed"; request = "010D"; formula = "A"; unit = "km/h"; precision = 0; )"
         R"t(id = "POWER"; name = "Power"; header = "7E4"; request = "220101"; formula = "A*value(\"PID_0D\")"; min = 0; )t"
         "max = 1; precision = 2; noted f:1: Power: reads the standard PID [0D], which comes in as PID_0D; "},
        {"Gear,G,2101,Lookup(A-B::-1='Reverse':2='Dri:ve'),0,9,,",
         R"(id = "GEAR"; name = "Gear"; request = "2101"; formula = "A-B"; values = { -1 = "Reverse", 2 = "Dri:ve" }; )"
         "min = 0; max = 9; precision = 0; "},
        {"A,a,2101,LOOKUP(),0,9,,\nB,b,2101,LOOKUP(A::1=x),0,9,,\nC,c,2101,LOOKUP(A::10=''),0,9,,\nD,d,2101,LOOKUP(A:),"
         "0,9,,",
         R"t(id = "C"; name = "C"; request = "2101"; formula = "A"; values = { 10 = "" }; min = 0; max = 9; precision = 0; )t"
         R"t(refused f:1: A: equation "LOOKUP()": of LOOKUP only tables without a default are understood (at character 8); )t"
         R"t(refused f:2: B: equation "LOOKUP(A::1=x)": of LOOKUP only a number = 'text' is understood, not "1=x" )t"
         R"t((at character 8); )t"
         R"t(refused f:4: D: equation "LOOKUP(A:)": of LOOKUP only tables without a default are understood )t"
         R"t((at character 8); )t"},
        {"A,a,,val{B}*2,0,1,,\n\nB,b,2101,A,0,1,,\nC,c,,val{D},0,1,,",
         R"(id = "A"; name = "A"; formula = "value(\"B\")*2"; min = 0; max = 1; precision = 2; )"
         R"(id = "B"; name = "B"; request = "2101"; formula = "A"; min = 0; max = 1; precision = 2; )"
         "refused f:4: C: its formula reads a value that is not in this file, or its own; "},
        {"A,a,2101,A,0,1,\xB0\xFF\x80,",
         "id = \"A\"; name = \"A\"; request = \"2101\"; formula = \"A\"; unit = \"°ÿ\xC2\x80"
         "\"; min = 0; max = 1; precision = 2; noted f:1: is no UTF-8; it was read as "
         "ISO 8859-1; "},
        {"A,a,2101,A,0,1,;;;,", R"(id = "A"; name = "A"; request = "2101"; formula = "A"; unit = ";;;"; min = 0; )"
                                "max = 1; precision = 2; "},
    };
    for (Case const& each : cases) {
        EXPECT_EQ(csvText(each.rows), each.text) << each.rows;
    }
}

TEST(ImportedCsv, SaysWhatATextIsThatIsNoTable)
{
    std::string const none = "f holds no signals | wanted are the columns Name, ShortName, ModeAndPID, Equation, Min "
                             "Value, Max Value, Units, Header";
    std::string const spreadsheet =
        "f is separated by semicolons, as spreadsheets write it | save it separated by commas and with decimal points";
    EXPECT_EQ(csvError("~ A,a,2101,A,0,1,V,\n# B,b,2101,A,0,1,V,\n ~x\n"), none);
    EXPECT_EQ(csvError(",,,,,,,\n"), none);
    EXPECT_EQ(csvError("Name,ModeAndPID,Equation\n"), none);
    EXPECT_EQ(csvError("a;b;c;d"), spreadsheet);
    EXPECT_EQ(csvError(";b;c;"), spreadsheet);
    EXPECT_EQ(csvError("a;b,c;d,e;f\nA,a,2101,A,0,1,V,"), spreadsheet);
    EXPECT_NE(csvError("a;b,c;d,e;f,g"), spreadsheet);
    EXPECT_NE(csvError("a;b;c"), spreadsheet);
    EXPECT_NE(csvError("Name,ModeAndPID\nA,2101"), none) << "two columns are no heading";
}

TEST(ImportedCsv, CountsLinesAndCutsCells)
{
    using Cells = std::vector<std::string>;
    auto const records = readCsv("a, \"b\"\"c\nd\" ,e\"f\"\r\n\n,x,\n\"\",\ny");
    ASSERT_EQ(records.size(), 4U);
    EXPECT_EQ(records[0].cells, (Cells{"a", "b\"c\nd ", "e\"f\""}));
    EXPECT_EQ(records[1].cells, (Cells{"", "x", ""}));
    EXPECT_EQ(records[2].cells, (Cells{"", ""}));
    EXPECT_EQ(records[3].cells, (Cells{"y"}));
    EXPECT_EQ(records[0].line, 1U);
    EXPECT_EQ(records[1].line, 4U);
    EXPECT_EQ(records[2].line, 5U);
    EXPECT_EQ(records[3].line, 6U);
    EXPECT_EQ(readCsv("a,").at(0).cells, (Cells{"a", ""}));
    EXPECT_TRUE(readCsv("\n\r\n").empty());
}

TEST(ImportedCsv, KnowsUtf8ByItsBytes)
{
    for (char const* const text : {"", "\x7F", "\xC2\x80", "\xDF\xBF", "\xE0\xA0\x80", "\xEF\xBF\xBF",
                                   "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF", "\xC2\xB0\xC2\xB0"}) {
        EXPECT_TRUE(isUtf8(text)) << text;
    }
    for (char const* const text :
         {"\x80", "\xBF", "\xC1\x80", "\xC2\x7F", "\xC2\xC0", "\xC2", "\xE0\x80", "\xF0\x80\x80", "\xF5\x80\x80\x80",
          "\xDF\xBF\xBF", "\xEF\xBF\xBF\xBF", "\xF4\x8F\xBF\xBF\xBF"}) {
        EXPECT_FALSE(isUtf8(text)) << text;
    }
    EXPECT_EQ(fromLatin1("\x7F\x80\xBF\xC0\xFF"), "\x7F\xC2\x80\xC2\xBF\xC3\x80\xC3\xBF");
}

TEST(ImportedCsv, ReadsCells)
{
    EXPECT_EQ(trimmedCell(" \t a b\t "), "a b");
    EXPECT_EQ(trimmedCell(" \t"), "");
    EXPECT_EQ(trimmedCell("a"), "a");
    EXPECT_EQ(requestCell(" 0x2a0b "), "2A0B");
    EXPECT_EQ(requestCell("0X 21"), "21");
    EXPECT_EQ(requestCell("2g"), std::nullopt);
    EXPECT_EQ(numberCell("-2.5e1"), -25.0);
    for (char const* const text : {"", "1x", "x", "inf", "nan", "1e999"}) {
        EXPECT_EQ(numberCell(text), std::nullopt) << text;
    }
    std::pair<char const*, std::size_t> const columns[] = {{"Name", 0},
                                                           {"ShortName", 1},
                                                           {"ModeAndPID", 2},
                                                           {"Equation", 3},
                                                           {"Min Value", 4},
                                                           {"Max Value", 5},
                                                           {"Units", 6},
                                                           {"Header", 7},
                                                           {"OBD Header", 7},
                                                           {"startDiagnostic", 8},
                                                           {"stopDiagnostic", 9},
                                                           {"scale", 10},
                                                           {"minimumRefreshDelayMillis", 11}};
    for (auto const& [name, column] : columns) {
        EXPECT_EQ(csvColumn(name), column) << name;
    }
    EXPECT_EQ(csvColumn("Names"), std::nullopt);
}

TEST(ImportedCsv, MakesIdsOfNames)
{
    ImportCollector collector("f");
    EXPECT_EQ(collector.newId("Tank 1/2"), "TANK_1_2");
    EXPECT_EQ(collector.newId("tank-1 (2)"), "TANK_1_2_2");
    EXPECT_EQ(collector.newId("TANK_1_2"), "TANK_1_2_3");
    EXPECT_EQ(collector.newId("  "), "SIGNAL");
    EXPECT_EQ(collector.newId(""), "SIGNAL_2");
    EXPECT_EQ(collector.newId(std::string(70, 'x')), std::string(56, 'X'));
    EXPECT_EQ(collector.newId(std::string(55, 'y') + " z"), std::string(55, 'Y'));
}

TEST(ImportedCsv, SpellsUnitsAsWeDo)
{
    std::pair<char const*, char const*> const units[] = {
        {"C", "°C"},     {"degC", "°C"},  {"Deg C", "°C"},  {"F", "°F"},        {"degF", "°F"}, {"deg", "°"},
        {"kph", "km/h"}, {"KPH", "km/h"}, {"kmh", "km/h"},  {"RPM", "rpm"},     {"sec", "s"},   {"Volt", "V"},
        {"volts", "V"},  {"Amps", "A"},   {"percent", "%"}, {"minutes", "min"}, {"bar", "bar"}, {"", ""},
    };
    for (auto const& [theirs, ours] : units) {
        EXPECT_EQ(knownUnit(theirs), ours) << theirs;
    }
}
