#include "libvelmora/signal/importing/csvtable.h"
#include "libvelmora/signal/importing/signalimport.h"
#include "libvelmora/signal/signalfile.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

using namespace velmora;

namespace {

std::string const heading = "Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,Header\n";

SignalImport importOf(std::string const& rows)
{
    return importSignalCsv(rows, "list.csv");
}

std::string refusal(std::string const& row)
{
    SignalImport const import = importOf(heading + row);
    EXPECT_TRUE(import.file.signals.empty()) << row;
    return import.refused.size() == 1 ? import.refused[0].what : "refused " + std::to_string(import.refused.size());
}

} // namespace

TEST(CsvImport, ReadsTheUsualForm)
{
    SignalImport const import = importOf(heading + "Pack voltage,Volt,0x220101,((m<8)+n)/10,0,400,volts,7E4\n"
                                                   "Oil life, OL , 2101 , A , 0,100,%, 7e0 \n");
    EXPECT_TRUE(import.refused.empty());
    ASSERT_EQ(import.file.signals.size(), 2U);
    Signal const& pack = import.file.signals[0];
    EXPECT_EQ(pack.id, "PACK_VOLTAGE");
    EXPECT_EQ(pack.request, (std::vector<unsigned char>{0x22, 0x01, 0x01}));
    EXPECT_EQ(toText(*pack.formula), "((M<<8)+N)/10");
    EXPECT_EQ(pack.unit, "V");
    EXPECT_EQ(pack.max, 400.0);
    EXPECT_EQ(pack.header, "7E4");
    EXPECT_TRUE(pack.reply.empty());
    EXPECT_EQ(import.file.signals[1].header, "7E0");
    EXPECT_TRUE(readSignals(toToml(import.file), "f").mistakes.empty());
}

TEST(CsvImport, TakesTheVarietyOfRealFiles)
{
    SignalImport const import = importOf("\xEF\xBB\xBF~ a comment, with commas\r\n"
                                         "One,O,2201019,A,0,1,,7E4\n"
                                         "# another\r"
                                         "\r\n,,,,,\n"
                                         "\"Two, quoted\",T,0902, K+1945,2015,2014,\"say \"\"years\"\"\",7E0\r\n" +
                                         heading + "One,O,2101,\"MAX(0,A)\",0,0,degC,");
    ASSERT_TRUE(import.refused.empty()) << import.refused[0].what;
    ASSERT_EQ(import.file.signals.size(), 3U);
    EXPECT_EQ(import.file.signals[0].request, (std::vector<unsigned char>{0x22, 0x01, 0x01})) << "the count is cut off";
    EXPECT_EQ(import.file.signals[1].name, "Two, quoted");
    EXPECT_EQ(import.file.signals[1].unit, "say \"years\"");
    EXPECT_EQ(import.file.signals[1].min, 2014.0) << "swapped";
    EXPECT_EQ(import.file.signals[2].id, "ONE_2");
    EXPECT_EQ(import.file.signals[2].unit, "°C");
    EXPECT_EQ(import.file.signals[2].min, std::nullopt);
    EXPECT_TRUE(import.file.signals[2].header.empty());
}

TEST(CsvImport, ReadsTwelveColumns)
{
    SignalImport const import =
        importOf("Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,OBD Header,startDiagnostic,"
                 "stopDiagnostic,scale,minimumRefreshDelayMillis\n"
                 "Slow,S,2101,A,0,255,V,79B,10C0,1081,0.5,5000\nPlain,P,2102,A,0,255,V,7E3,,,1,\n");
    ASSERT_EQ(import.file.signals.size(), 2U);
    Signal const& slow = import.file.signals[0];
    EXPECT_FALSE(slow.enabled);
    EXPECT_NE(slow.reason.find("10C0"), std::string::npos);
    EXPECT_EQ(toText(*slow.formula), "A*0.5");
    EXPECT_EQ(slow.rate, 0.2);
    EXPECT_EQ(slow.reply, "7A3");
    EXPECT_TRUE(import.file.signals[1].enabled);
}

TEST(CsvImport, FillsInRepliesAndSaysThatTheyAreAssumed)
{
    SignalImport const import = importOf(heading + "A,a,22D100,A,0,1,,726\nB,b,22D100,A,0,1,,DA10F1\n"
                                                   "C,c,2101,A,0,1,,6C10F1\nD,d,0105,A,0,1,,7DF\n");
    ASSERT_EQ(import.file.signals.size(), 4U);
    EXPECT_EQ(import.file.signals[3].header, "7DF");
    EXPECT_EQ(import.file.signals[3].reply, "") << "it asks all";
    EXPECT_EQ(import.file.signals[0].reply, "72E");
    EXPECT_NE(import.file.signals[0].reason.find("assumed"), std::string::npos);
    EXPECT_TRUE(import.file.signals[1].reply.empty());
    EXPECT_EQ(import.file.signals[2].reply, "6CF110");
    EXPECT_EQ(import.notes.size(), 2U);
}

TEST(CsvImport, ReadsTablesOfTextsAndValuesOfOtherRows)
{
    SignalImport const import = importOf(heading + "Gear,G,220101,LOOKUP(A::1='Park':2='Rev:erse'),0,9,,7E4\n"
                                                   "Power,P,,val{Amps}*val{Gear},0,9,kW,\n"
                                                   "Amps,A,220102,Signed(A),0,9,A,7E4\n");
    ASSERT_EQ(import.file.signals.size(), 3U);
    EXPECT_EQ(import.file.signals[0].values.at(2), "Rev:erse");
    EXPECT_EQ(toText(*import.file.signals[1].formula), "value(\"AMPS\")*value(\"GEAR\")");
    EXPECT_TRUE(import.file.signals[1].request.empty());
}

TEST(CsvImport, ListsWhatItDoesNotUnderstand)
{
    EXPECT_NE(refusal("A,a,2E0101,A,0,1,,7E4\n").find("service 2E"), std::string::npos);
    EXPECT_NE(refusal("A,a,1003,A,0,1,,7E4\n").find("session"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,Signed(A*256)+B,0,1,,7E4\n").find("different things"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,A<7,0,1,,7E4\n").find("shift"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,AVG(5:A),0,1,,7E4\n").find("keeps state"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,(A))+B,0,1,,7E4\n").find("left over"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,LOOKUP(A:0:1='x'),0,1,,7E4\n").find("default"), std::string::npos);
    EXPECT_NE(refusal("A,a,22XY,A,0,1,,7E4\n").find("hexadecimal"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,A,0,1,,17FC007B\n").find("header"), std::string::npos);
    EXPECT_NE(refusal("A,a,,A,0,1,,7E4\n").find("no request"), std::string::npos);
    EXPECT_NE(refusal("A,a,220101,val{B},0,1,,7E4\n").find("not in this file"), std::string::npos);
    EXPECT_NE(refusal(",a,220101,A,0,1,,7E4\n").find("no name"), std::string::npos);
    SignalImport const circle = importOf(heading + "A,a,,val{B},0,1,,\nB,b,,val{A}+1,0,1,,\nC,c,,val{A},0,1,,\n"
                                                   "D,d,2101,A,0,1,,7E0\nE,e,,val{D},0,nan,,\n");
    EXPECT_EQ(circle.refused.size(), 3U) << "two that read each other, and one that reads them";
    ASSERT_EQ(circle.file.signals.size(), 2U);
    EXPECT_FALSE(circle.file.signals[1].max) << "not a number";
}

TEST(CsvImport, RefusesWhatIsNoSuchTable)
{
    EXPECT_THROW(importOf(""), Error);
    EXPECT_THROW(importOf("Name;ShortName;ModeAndPID;Equation\nA;a;2101;A*0,5\n"), Error);
    EXPECT_NO_THROW(importOf("A,a,2101,A,0,1,\xB0,\n"));
    EXPECT_EQ(importOf("A,a,2101,A,0,1,\xB0,\n").file.signals[0].unit, "°");
}

TEST(CsvTable, CutsAnyText)
{
    auto const records = readCsv("a,\"b\nc\"\r\n\r\nd");
    ASSERT_EQ(records.size(), 2U);
    EXPECT_EQ(records[0].cells, (std::vector<std::string>{"a", "b\nc"}));
    EXPECT_EQ(records[1].line, 4U);
    EXPECT_EQ(readCsv("a,\"open").at(0).cells.at(1), "open");
    EXPECT_EQ(readCsv(R"("a ""b""",c)").at(0).cells, (std::vector<std::string>{"a \"b\"", "c"}));
    EXPECT_EQ(readCsv(R"("a",""")").at(0).cells, (std::vector<std::string>{"a", "\""})) << "a quote, and no end";
    EXPECT_EQ(readCsv(std::string_view(R"("a""b")", 3)).at(0).cells.at(0), "a")
        << "what stands behind the end counts not";
    EXPECT_TRUE(isUtf8("°"));
    EXPECT_FALSE(isUtf8("\xB0"));
    EXPECT_FALSE(isUtf8("\xC2"));
}

TEST(CsvImport, TakesStandardPidsOfEquationsAsSignals)
{
    SignalImport const import = importOf(heading + "Power,P,220101,A*[0d]+[0D],0,1,kW,7E4\n"
                                                   "Other,O,220102,A+[0d],0,1,,7E4\n"
                                                   "Phone,X,220103,A+[ff1001],0,1,,7E4\n"
                                                   "Unknown,U,220104,A+[71],0,1,,7E4\n");
    ASSERT_EQ(import.file.signals.size(), 3U);
    Signal const& speed = import.file.signals[0];
    EXPECT_EQ(speed.id, "PID_0D");
    EXPECT_EQ(speed.request, (std::vector<unsigned char>{0x01, 0x0D}));
    EXPECT_EQ(speed.unit, "km/h");
    EXPECT_EQ(toText(*import.file.signals[1].formula), "A*value(\"PID_0D\")+value(\"PID_0D\")");
    EXPECT_EQ(toText(*import.file.signals[2].formula), "A+value(\"PID_0D\")");
    ASSERT_EQ(import.refused.size(), 2U);
    EXPECT_NE(import.refused[0].what.find("no standard PID"), std::string::npos) << import.refused[0].what;
    EXPECT_NE(import.refused[1].what.find("[71] is not known"), std::string::npos) << import.refused[1].what;
}
