// Lines of the bus as an adapter prints them, by the rules of each bus.
#include "libvelmora/channel/busline.h"
#include "libvelmora/channel/replylines.h"

#include <gtest/gtest.h>

#include <cstdio>

namespace velmora {

namespace {

// "S 7E8 4100" for what a line is read as: its kind, its module, its payload; "-" for no whole frame.
std::string readAs(BusKind bus, std::string const& digits, bool extended = false)
{
    std::optional<BusLine> const line = parseBusLine(bus, digits, extended);
    if (!line) {
        return "-";
    }
    constexpr char const* kinds[] = {"S ", "F ", "C "};
    char module[12];
    std::snprintf(module, sizeof(module), "%X ", line->module);
    return kinds[static_cast<int>(line->kind)] + (line->header + " ") + module + frameDigits(line->payload) + "/" +
           frameDigits(line->bytes);
}

TEST(BusLines, AreReadByTheRulesOfTheirBus)
{
    struct Case
    {
        BusKind bus;
        char const* digits;
        char const* read;
    };
    Case const cases[] = {
        {BusKind::Can11, "7E8064100BE3FA813", "S 7E8 7E8 4100BE3FA813/064100BE3FA813"},
        {BusKind::Can11, "7E8014100", "S 7E8 7E8 41/014100"},
        {BusKind::Can11, "7E80141", "S 7E8 7E8 41/0141"},
        {BusKind::Can11, "7E801", "-"},
        {BusKind::Can11, "7E8024", "-"},
        {BusKind::Can11, "7E8004100", "-"},
        {BusKind::Can11, "7E80241", "-"},
        {BusKind::Can11, "7E8074100BE3FA8135577", "-"},
        {BusKind::Can11, "7E8074100BE3FA81355", "S 7E8 7E8 4100BE3FA81355/074100BE3FA81355"},
        {BusKind::Can11, "7E80841000102030405060", "-"},
        {BusKind::Can11, "7E81014490201314434", "F 7E8 7E8 490201314434/1014490201314434"},
        {BusKind::Can11, "7E81007490201314434", "F 7E8 7E8 490201314434/1007490201314434"},
        {BusKind::Can11, "7E81006490201314434", "-"}, // it would fit in one frame
        {BusKind::Can11, "7E81100490201314434", "F 7E8 7E8 490201314434/1100490201314434"},
        {BusKind::Can11, "7E810144902013144", "-"},
        {BusKind::Can11, "7E821445239", "C 7E8 7E8 445239/21445239"},
        {BusKind::Can11, "7E8300000", "-"},
        {BusKind::Can29, "18DAF110064100BE3FA813", "S 18DAF110 18DAF110 4100BE3FA813/064100BE3FA813"},
        {BusKind::Can29, "98DAF1100141", "S 98DAF110 18DAF110 41/0141"},
        {BusKind::J1850, "486B104100BE3EB811FA", "S 486B10 10 4100BE3EB811/4100BE3EB811FA"},
        {BusKind::J1850, "486B1041FA", "S 486B10 10 41/41FA"},
        {BusKind::J1850, "486B1041", "-"},
        {BusKind::J1850, "486B1041F", "-"},
        {BusKind::Iso9141, "486B114105", "S 486B11 11 41/4105"},
        {BusKind::Kwp, "82F1104100C4", "S 82F110 10 4100/4100C4"},
        {BusKind::Kwp, "82F1104100", "S 82F110 10 4100/4100"},
        {BusKind::Kwp, "82F11041", "-"},
        {BusKind::Kwp, "82F1104100C4C4", "-"},
        {BusKind::Kwp, "80F110024100C4", "S 80F11002 10 4100/4100C4"},
        {BusKind::Kwp, "80F11000C4", "-"},
        {BusKind::Unknown, "7E8064100BE3FA813", "-"},
    };
    for (Case const& each : cases) {
        EXPECT_EQ(readAs(each.bus, each.digits), each.read) << each.digits;
    }
    EXPECT_EQ(readAs(BusKind::Can11, "607F1024100", true), "S 607 607 4100/024100");
    EXPECT_EQ(readAs(BusKind::Can11, "607F1054100010203", true), "S 607 607 4100010203/054100010203");
    EXPECT_EQ(readAs(BusKind::Can11, "607F102", true), "-");
    EXPECT_EQ(readAs(BusKind::Can11, "607F10241", true), "-");
    EXPECT_EQ(readAs(BusKind::Can11, "607F10141", true), "S 607 607 41/0141");
    EXPECT_EQ(readAs(BusKind::Can11, "607F110064100010203", true), "F 607 607 4100010203/10064100010203");
    EXPECT_EQ(readAs(BusKind::Can11, "607F110054100010203", true), "-");
    EXPECT_EQ(readAs(BusKind::Can11, "607F110064100010G03", true), "-");
    EXPECT_EQ(readAs(BusKind::Can11, "607F10741000102030405", true), "-") << "a byte of a frame is the address";
}

// Check bytes of frames that stand in data sheets and standards, and of single bits.
TEST(BusLines, HaveCheckBytes)
{
    EXPECT_TRUE(hasRightCheckByte(BusKind::J1850, "486B104100BE3EB811FA"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::J1850, "003B"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::J1850, "FFFF"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::J1850, "801D"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::J1850, "0126"));
    EXPECT_FALSE(hasRightCheckByte(BusKind::J1850, "486B104100BE3EB811FB"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::Kwp, "82F1104100C4"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::Iso9141, "FFFFFE"));
    EXPECT_FALSE(hasRightCheckByte(BusKind::Kwp, "82F1104100C5"));
    EXPECT_FALSE(hasRightCheckByte(BusKind::Kwp, "82F1104100C"));
    EXPECT_FALSE(hasRightCheckByte(BusKind::Kwp, "82"));
    EXPECT_TRUE(hasRightCheckByte(BusKind::Kwp, "8282"));
    EXPECT_EQ(frameDigits({0x00, 0x9A, 0xF0, 0x0F}), "009AF00F");
}

TEST(ReplyLines, AreToldApart)
{
    struct Case
    {
        char const* line;
        LineKind kind;
        bool notice;
        char const* text;
    };
    Case const cases[] = {
        {"41 00", LineKind::Data, false, "4100"},
        {"SEARCHING...41 00", LineKind::Data, true, "4100"},
        {"SEARCHING...", LineKind::Notice, true, ""},
        {"SEARCHING", LineKind::Notice, true, ""},
        {"BUS INIT: ...OK", LineKind::Notice, true, ""},
        {"BUS INIT: OK41 00", LineKind::Data, true, "4100"},
        {"BUS INIT: ...", LineKind::Notice, true, ""},
        {"BUS INIT: ...ERROR", LineKind::Error, false, "BUSINIT:...ERROR"},
        {"SEARCHING...UNABLE TO CONNECT", LineKind::Error, true, "UNABLETOCONNECT"},
        {"OK", LineKind::Notice, true, ""},
        {"", LineKind::Text, false, ""},
        {"?", LineKind::Refused, false, "?"},
        {"??", LineKind::Text, false, "??"},
        {"NO DATA", LineKind::Error, false, "NODATA"},
        {"ERR94", LineKind::Error, false, "ERR94"},
        {"FB ERROR", LineKind::Error, false, "FBERROR"},
        {"41 00 <DATA ERROR", LineKind::Flagged, false, "4100<DATAERROR"},
        {"41 00 <RX ERROR", LineKind::Flagged, false, "4100<RXERROR"},
        {"DATA ERROR", LineKind::Error, false, "DATAERROR"},
        {"ELM327 v1.5", LineKind::Text, false, "ELM327V1.5"},
    };
    for (Case const& each : cases) {
        ClassifiedLine const line = classifyLine(each.line);
        EXPECT_EQ(line.kind, each.kind) << each.line;
        EXPECT_EQ(line.hadNotice, each.notice) << each.line;
        EXPECT_EQ(line.text, each.text) << each.line;
    }
    for (char const* const reset : {"ELM327 v1.5", "LV RESET", "ERR94", "ERR00"}) {
        EXPECT_TRUE(tellsReset(reset)) << reset;
    }
    for (char const* const other : {"ERR9", "ERR944", "ERRX4", "41 00", "ELM 1"}) {
        EXPECT_FALSE(tellsReset(other)) << other;
    }
}

TEST(ReplyLines, AreSplitAtTheirEnds)
{
    HabitCounts counts{};
    std::vector<ReplyLine> const lines = splitReply(std::string_view("41 00\r\n  \r4\t1\x01\n4\x00"
                                                                     "2\n\x7F~\rlast",
                                                                     26),
                                                    counts);
    std::string all;
    for (ReplyLine const& each : lines) {
        all += each.text + (each.stray ? "!" : "") + "|";
    }
    EXPECT_EQ(all, "41 00|41!|42|~!|last|");
    EXPECT_EQ(counts[static_cast<std::size_t>(Habit::StrayBytes)], 3U);
}

} // namespace

} // namespace velmora
