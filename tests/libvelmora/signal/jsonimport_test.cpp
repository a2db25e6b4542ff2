#include "libvelmora/signal/importing/signalimport.h"
#include "libvelmora/signal/importing/wicanformula.h"
#include "libvelmora/signal/signalfile.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

using namespace velmora;

namespace {

using Bytes = std::vector<unsigned char>;

std::optional<double> valueOf(Signal const& signal, Bytes const& data)
{
    return evaluate(*signal.formula, {data, {}});
}

std::string obdbSignal(std::string const& format)
{
    return R"({"commands": [{"hdr": "7E0", "cmd": {"22": "1E1C"}, "freq": 5, "signals": [
        {"id": "X_Y", "name": "X y", "fmt": )" +
           format + "}]}]}";
}

std::string onlyRefusal(SignalImport const& import)
{
    EXPECT_TRUE(import.file.signals.empty());
    return import.refused.size() == 1 ? import.refused[0].what : std::to_string(import.refused.size());
}

std::string wicanOf(std::string const& pid, std::string const& expression)
{
    return R"({"car_model": "x", "init": "ATSP6;ATSH7E4;ATCRA7EC;", "pids": [{"pid": ")" + pid +
           R"(", "parameters": {"SOC": ")" + expression + R"("}}]})";
}

} // namespace

TEST(ObdbImport, ReadsFieldsOfBits)
{
    struct Case
    {
        char const* format;
        Bytes data;
        double value;
    };
    Case const cases[] = {
        {R"({"len": 8, "max": 215, "add": -40, "unit": "celsius"})", {90}, 50.0},
        {R"({"bix": 8, "len": 16, "mul": 3, "div": 2})", {0, 1, 0}, 384.0},
        {R"({"bix": 8, "len": 16, "blsb": true})", {0, 1, 2}, 513.0},
        {R"({"bix": 3, "len": 2})", {0x18}, 3.0},
        {R"({"bix": 6, "len": 4})", {0x02, 0xC0}, 11.0},
        {R"({"len": 16, "sign": true, "div": 10})", {0xFC, 0xBA}, -83.8},
        {R"({"bix": 4, "len": 12, "sign": true})", {0x0F, 0xFF}, -1.0},
        {R"({"len": 32})", {0xFF, 0xFF, 0xFF, 0xFF}, 4294967295.0},
    };
    for (Case const& each : cases) {
        SignalImport const import = importObdb(obdbSignal(each.format), "f.json");
        ASSERT_EQ(import.file.signals.size(), 1U) << each.format;
        auto const value = valueOf(import.file.signals[0], each.data);
        ASSERT_TRUE(value) << each.format;
        EXPECT_DOUBLE_EQ(*value, each.value) << each.format << toText(*import.file.signals[0].formula);
        EXPECT_TRUE(readSignals(toToml(import.file), "f").mistakes.empty()) << toToml(import.file);
    }
}

TEST(ObdbImport, ReadsAddressesTimesAndMeanings)
{
    SignalImport const import = importObdb(
        R"({"commands": [
            {"hdr": "FC00", "pri": "17", "tst": "7B", "rax": "17FE007B", "fcm1": true, "tmo": "64",
             "cmd": {"22": "1E3D"}, "din": "03",
             "signals": [{"id": "A_MODE", "name": "Mode", "fmt": {"len": 8, "map": {"1": {"value": "ON",
                          "description": "On"}, "2": {"value": "OFF"}}}}]},
            {"hdr": "6F1", "eax": "07", "tst": "F1", "rax": "607", "cmd": {"22": "DDBC"},
             "signals": [{"id": "B", "fmt": {"len": 8, "nullmax": 255}}]}]})",
        "f.json");
    ASSERT_EQ(import.file.signals.size(), 2U) << import.refused.size();
    Signal const& mode = import.file.signals[0];
    EXPECT_EQ(mode.header, "17FC007B");
    EXPECT_EQ(mode.reply, "17FE007B");
    EXPECT_EQ(mode.flowControl->header, "17FC007B");
    EXPECT_EQ(mode.timeout, 410U);
    EXPECT_FALSE(mode.enabled);
    EXPECT_EQ(mode.reason, "needs session 03, which is not opened");
    EXPECT_EQ(mode.values.at(1), "On");
    EXPECT_EQ(mode.values.at(2), "OFF");
    EXPECT_EQ(import.file.signals[1].extendedAddress, 0x07);
    EXPECT_EQ(import.file.signals[1].tester, 0xF1);
    EXPECT_EQ(import.notes.size(), 1U) << "values that stand for none";
}

TEST(ObdbImport, ListsWhatItDoesNotUnderstand)
{
    EXPECT_NE(onlyRefusal(importObdb(obdbSignal(R"({"len": 64})"), "f")).find("64 bits"), std::string::npos);
    EXPECT_NE(onlyRefusal(importObdb(obdbSignal(R"({"bix": 4, "len": 8, "blsb": true})"), "f")).find("whole bytes"),
              std::string::npos);
    EXPECT_NE(onlyRefusal(importObdb(obdbSignal("7"), "f")).find("no bits"), std::string::npos);
    EXPECT_NE(onlyRefusal(importObdb(R"({"commands": [{"cmd": {"31": "0101"}, "signals": [{"id": "A"}]}]})", "f"))
                  .find("service 31"),
              std::string::npos);
}

TEST(WicanImport, CountsBytesOfFrames)
{
    SignalImport const import = importWican(wicanOf("2201019", "B10/2"), "f");
    ASSERT_EQ(import.file.signals.size(), 1U) << onlyRefusal(import);
    Signal const& charge = import.file.signals[0];
    EXPECT_EQ(charge.request, (Bytes{0x22, 0x01, 0x01}));
    EXPECT_EQ(toText(*charge.formula), "E/2");
    EXPECT_TRUE(charge.reply.empty()) << "7EC follows from 7E4";
    EXPECT_EQ(toText(*importWican(wicanOf("2101", "[S18:S19]*0.1"), "f").file.signals[0].formula),
              "signed16(M*256+N)*0.1");
    EXPECT_EQ(fromFrameBytes("B3+B7:4^1", ReplyFrames::One, 2), "A+bit(E,4)^1");
    EXPECT_EQ(fromFrameBytes("S9", ReplyFrames::Several, 3), "signed8(D)");
    EXPECT_EQ(fromFrameBytes("B806", ReplyFrames::Several, 3), "ZZ") << "the last byte that has a name";
    EXPECT_THROW(fromFrameBytes("B807", ReplyFrames::Several, 3), FormulaError);
    EXPECT_THROW(fromFrameBytes("B0", ReplyFrames::One, 0), FormulaError) << "the length of the frame";
    EXPECT_EQ(fromFrameBytes("B1+B7", ReplyFrames::One, 0), "A+G");
    EXPECT_THROW(fromFrameBytes("B8", ReplyFrames::One, 0), FormulaError);
}

TEST(WicanImport, ListsWhatCantBeTold)
{
    EXPECT_NE(onlyRefusal(importWican(wicanOf("220101", "B6"), "f")).find("one frame"), std::string::npos);
    EXPECT_NE(onlyRefusal(importWican(wicanOf("2201019", "B8"), "f")).find("no data"), std::string::npos);
    EXPECT_NE(onlyRefusal(importWican(wicanOf("2201019", "[B14:B17]"), "f")).find("one frame"), std::string::npos);
    EXPECT_NE(onlyRefusal(importWican(wicanOf("2F01019", "B10"), "f")).find("service 2F"), std::string::npos);
    std::string const extended =
        R"({"init": "ATSH6F1;ATCEA07;", "pids": [{"pid": "22DDBC9", "parameters": {"A": "B10"}}]})";
    EXPECT_NE(onlyRefusal(importWican(extended, "f")).find("extended"), std::string::npos);
    std::string const session =
        R"({"init": "ATSH7E0;", "pids": [{"pid": "2201019", "pid_init": "1003;", "parameters": {"A": "B10"}}]})";
    SignalImport const import = importWican(session, "f");
    ASSERT_EQ(import.file.signals.size(), 1U);
    EXPECT_FALSE(import.file.signals[0].enabled);
    ASSERT_EQ(import.notes.size(), 1U);
    EXPECT_EQ(import.notes[0].what, "needs session 1003, which is not opened");
}

TEST(SignalImport, ListsWhatIsRefusedInItsOrder)
{
    SignalImport const import = importWican(
        R"({"init": "ATSH7E4;", "pids": [{"pid": "2201019", "parameters": {"A": "B8", "B": "B0", "C": "B16"}}]})", "f");
    std::vector<std::string> names;
    for (SignalMistake const& each : import.refused) {
        names.push_back(each.key);
    }
    EXPECT_EQ(names, (std::vector<std::string>{"A", "B", "C"}));
}

TEST(AbrpImport, ReadsRequestsByKey)
{
    SignalImport const import = importAbrp(
        R"({"init_commands": {"command": ["ATSP6"]},
            "soc": {"equation": "(a<<8)+b", "command": "22028C", "ecu": "7E5", "minValue": "0", "maxValue": "100"},
            "is_charging": {"equation": "{A:2}", "type": "Boolean", "command": "22028D", "ecu": "7E5"},
            "bad": {"equation": "A+", "command": "22028D", "ecu": "7E5"}})",
        "f");
    ASSERT_EQ(import.file.signals.size(), 2U);
    EXPECT_EQ(import.refused.size(), 1U);
    Signal const& charge = import.file.signals[1];
    EXPECT_EQ(charge.id, "SOC");
    EXPECT_EQ(valueOf(charge, {1, 2}), 258.0);
    EXPECT_EQ(charge.max, 100.0);
    EXPECT_EQ(import.file.signals[0].values.at(1), "yes");
    EXPECT_EQ(importAbrp(R"({"init_commands": {"command": ["ATCAF0"]}, "a": {"equation": "A", "command": "2101",
                             "ecu": "7E0"}})",
                         "f")
                  .refused.size(),
              1U);
    SignalImport const session = importAbrp(R"({"data_commands": {"command": ["ATSH7E0", "10C0"]},
                                                "a": {"equation": "A", "command": "2101", "ecu": "7E0"}})",
                                            "f");
    ASSERT_EQ(session.file.signals.size(), 1U);
    EXPECT_FALSE(session.file.signals[0].enabled);
    EXPECT_EQ(session.file.signals[0].reason, "needs session 10C0, which is not opened");
}

TEST(SignalImport, TellsTheFormsApart)
{
    EXPECT_EQ(importSignals(obdbSignal(R"({"len": 8})"), "f").file.signals.size(), 1U);
    EXPECT_EQ(importSignals(wicanOf("2201019", "B10"), "f").file.signals.size(), 1U);
    EXPECT_EQ(importSignals(R"({"a": {"equation": "A", "command": "2101", "ecu": "7E0"}})", "f").file.signals.size(),
              1U);
    EXPECT_EQ(importSignals("A,a,2101,A,0,1,V,7E0", "f").file.signals.size(), 1U);
    EXPECT_THROW(importSignals("{\"other\": 1}", "f"), Error);
    EXPECT_THROW(importSignals("{", "f"), Error);
}
