// What operators and functions of the face print, each whole.
#include "libvelmora/report/document/vehiclereportjson.h"

#include <velmora/car.h>
#include <velmora/error.h>
#include <velmora/modules.h>

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;

template <typename Value>
std::string shownText(Value const& value)
{
    std::ostringstream text;
    text << value;
    return text.str();
}

Reading shownReading(Reading::Value value, std::string unit, int precision = 0)
{
    Reading reading;
    reading.name = "N";
    reading.value = std::move(value);
    reading.unit = std::move(unit);
    reading.precision = precision;
    return reading;
}

TEST(Printing, ShowsEachKindOfError)
{
    std::pair<ErrorKind, char const*> const kinds[] = {
        {ErrorKind::Failed, "failed"},
        {ErrorKind::WrongUse, "wrong use"},
        {ErrorKind::PortFailed, "port not opened"},
        {ErrorKind::AdapterSilent, "adapter silent"},
        {ErrorKind::VehicleSilent, "vehicle silent"},
        {ErrorKind::NotSupported, "not supported"},
        {ErrorKind::Refused, "refused"},
        {ErrorKind::LinkLost, "link lost"},
        {ErrorKind::Interrupted, "interrupted"},
    };
    for (auto const& [kind, text] : kinds) {
        EXPECT_EQ(shownText(kind), text);
    }
    EXPECT_EQ(shownText(Error(ErrorKind::Failed, "what", {"a", "b"})), "what\n  - a\n  - b");
}

TEST(Printing, ShowsReadingsWithTheirUnits)
{
    EXPECT_EQ(shownText(shownReading(1.25, "V", 1)), "N: 1.2 V");
    EXPECT_EQ(shownText(shownReading(1.0, "")), "N: 1");
    EXPECT_EQ(shownText(shownReading({}, "V")), "N: -") << "a unit of nothing";
    EXPECT_EQ(shownText(shownReading(std::string("open"), "")), "N: open");
    EXPECT_EQ(shownText(shownReading(std::string("open"), "x")), "N: open x");
    EXPECT_EQ(number(shownReading(std::string("1"), "")), std::nullopt);
    EXPECT_EQ(number(shownReading(2.5, "")), 2.5);
}

TEST(Printing, ShowsFoundModules)
{
    FoundModule full{"7E0", "7E8", "ECM", "P1", "S1", 3U};
    full.identifiers = {{0xF190, "VIN"}, {0x1A80, "x"}};
    std::vector<FoundModule> const modules = {full, {"8210F1", "82F110", "", "", "", {}}};
    EXPECT_EQ(toText(modules, {}), "  asked   answers  name  part  software  codes\n"
                                   "  7E0     7E8      ECM   P1    S1            3\n"
                                   "  8210F1  10       -     -     -             -\n"
                                   "\n"
                                   "Control module 7E8\n"
                                   "  1A80  Identification 80 by service 1A                             x\n"
                                   "  F190  Vehicle Identification Number                               VIN\n");
    Json const json = Json::parse(toJson(modules));
    EXPECT_EQ(json[0].dump(), R"({"request":"7E0","reply":"7E8","name":"ECM","part":"P1","software":"S1","codes":3,)"
                              R"("identifiers":{"1A80":"x","F190":"VIN"}})");
    EXPECT_EQ(json[1].dump(),
              R"({"request":"8210F1","reply":"82F110","name":null,"part":null,"software":null,"codes":null})");
}

TEST(Printing, ShowsCodesByServices19And18)
{
    UdsModuleReport own{"7E8", "ECM", TopicAnswer::Read, "", false, false, 0x01, 0xFF};
    own.codes = {{"P0299", 0x16, "029916", 0x2F, {"present", "confirmed"}, "Meaning", "Failure"},
                 {"P0300", 0x00, "030000", 0x00, {}, "", "Failure"},
                 {"P0301", 0x00, "030100", 0x00, {}, "Meaning", ""}};
    UdsModuleReport untold{"7E9", "", TopicAnswer::Read, "", false, true, {}, 0x00};
    untold.codes = {{"P0299", 0x16, "029916", 0x2F, {}, "", ""}};
    UdsModuleReport kwp{"10", "", TopicAnswer::Read, "", true, false, {}, {}};
    kwp.codes = {{"", 0, "0299", 0xE0, {}, "", ""}};
    UdsModuleReport const refused{"7EA", "X", TopicAnswer::Refused, "is refused: busy"};
    UdsModuleReport const silent18{"7EC", "", TopicAnswer::Silent, "is not answered", true};
    UdsModuleReport const none{"7EB", "", TopicAnswer::Read, ""};
    std::vector<UdsModuleReport> const modules = {own, untold, kwp, refused, silent18, none};
    EXPECT_EQ(toText(modules, {}), "Control module 7E8: ECM\n"
                                   "  P0299-16 (029916)  present, confirmed  Meaning; Failure\n"
                                   "  P0300-00 (030000)  -                   Failure\n"
                                   "  P0301-00 (030100)  -                   Meaning\n"
                                   "Control module 7E9\n"
                                   "  P0299-16  not told\n"
                                   "Control module 10\n"
                                   "  by service 18, in numbers that may be the maker's own:\n"
                                   "  0299  status E0\n"
                                   "Control module 7EA: X\n"
                                   "  service 19 is refused: busy\n"
                                   "Control module 7EC\n"
                                   "  service 18 is not answered\n"
                                   "Control module 7EB\n"
                                   "  no codes\n");
    Json const json = Json::parse(toJson(modules));
    EXPECT_EQ(json[0]["codes"][0].dump(),
              R"({"code":"P0299","type":"16","hex":"029916","status":"2F",)"
              R"("states":["present","confirmed"],"meaning":"Meaning","failure":"Failure"})");
    EXPECT_EQ(json[0]["format"], "01");
    EXPECT_EQ(json[0]["available"], "FF");
    EXPECT_FALSE(json[0].contains("byService18"));
    EXPECT_TRUE(json[1]["format"].is_null());
    EXPECT_EQ(json[2]["byService18"].dump(), R"([{"hex":"0299","status":"E0"}])");
    EXPECT_TRUE(json[2]["codes"].is_null());
    EXPECT_TRUE(json[3]["codes"].is_null()) << "refused is not none";
    EXPECT_EQ(json[3]["reason"], "is refused: busy");
    EXPECT_EQ(json[5]["codes"].dump(), "[]");
}

} // namespace
