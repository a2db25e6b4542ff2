#include "libvelmora/report/codereport.h"
#include "libvelmora/report/plain/reporttext.h"

#include <velmora/findings.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace velmora;
using Answer = CodeList::Answer;

CodeList listWithCode(CodeKind kind)
{
    return {kind, Answer::Read, {}, {{"P0133", "Powertrain", {{"Generic", "Slow"}}}}};
}

CodeList listWithout(CodeKind kind, Answer answer, std::string const& reason = {})
{
    return {kind, answer, reason, {}};
}

TEST(CodeReportView, TellsPlainlyWhyThereAreNoCodes)
{
    CodeReport const report{true,
                            {listWithCode(CodeKind::Confirmed), listWithout(CodeKind::Pending, Answer::Read),
                             listWithout(CodeKind::Permanent, Answer::Silent)}};
    EXPECT_EQ(toText(report, Style()), "  Lamp           on\n"
                                       "  Confirmed      1 code\n"
                                       "    P0133  Generic        Slow\n"
                                       "  Pending        none stored\n"
                                       "  Permanent      no answer\n");
    CodeReport const other{std::nullopt,
                           {listWithout(CodeKind::Confirmed, Answer::Unreadable),
                            listWithout(CodeKind::Permanent, Answer::Refused, "service not supported (11)")}};
    EXPECT_EQ(toText(other, Style()), "  Lamp           -\n"
                                      "  Confirmed      the reply can't be read\n"
                                      "  Permanent      refused: service not supported (11)\n");
}

TEST(CodeReportView, HeadsEachModule)
{
    EXPECT_EQ(toText(std::vector<ModuleCodes>{{0x7E8, "ECM", {false, {}}}, {0x18DAF110, "TCM", {true, {}}}}, Style()),
              "Control module 7E8: ECM\n  Lamp           off\n"
              "\nControl module 18DAF110: TCM\n  Lamp           on\n");
}

TEST(CodeReportView, ColoursTheLampAndWhatIsStored)
{
    CodeReport const report{
        true, {listWithout(CodeKind::Confirmed, Answer::Read), listWithout(CodeKind::Permanent, Answer::Silent)}};
    EXPECT_EQ(toText(report, Style(true)), "  Lamp           \033[31mon\033[0m\n"
                                           "  Confirmed      \033[32mnone stored\033[0m\n"
                                           "  Permanent      \033[2mno answer\033[0m\n");
    EXPECT_TRUE(toText(CodeReport{false, {listWithCode(CodeKind::Pending)}}, Style(true))
                    .starts_with("  Lamp           \033[32moff\033[0m\n"
                                 "  Pending        \033[33m1 code\033[0m\n"));
}

TEST(CodeReportView, FindingsAreTheLampAndConfirmedAndPermanentCodes)
{
    EXPECT_FALSE(hasFindings({std::nullopt, {}}));
    EXPECT_FALSE(
        hasFindings({false, {listWithCode(CodeKind::Pending), listWithout(CodeKind::Confirmed, Answer::Read)}}));
    EXPECT_TRUE(hasFindings({true, {}}));
    EXPECT_TRUE(hasFindings({false, {listWithCode(CodeKind::Confirmed)}}));
    EXPECT_TRUE(hasFindings({false, {listWithCode(CodeKind::Permanent)}}));
}

TEST(CodeReportView, AnAnswerIsAListThatWasRead)
{
    EXPECT_FALSE(hasAnswer({true, {listWithout(CodeKind::Confirmed, Answer::Silent)}}));
    EXPECT_FALSE(hasAnswer({true, {listWithout(CodeKind::Confirmed, Answer::Refused, "busy (21)")}}));
    EXPECT_TRUE(hasAnswer({{}, {listWithout(CodeKind::Pending, Answer::Read)}}));
}

TEST(CodeReportView, CanBeCheckedByTheLampOrTheConfirmedCodes)
{
    EXPECT_FALSE(canBeChecked({std::nullopt, {listWithout(CodeKind::Pending, Answer::Read)}}));
    EXPECT_FALSE(canBeChecked({std::nullopt, {listWithout(CodeKind::Confirmed, Answer::Silent)}}));
    EXPECT_TRUE(canBeChecked({false, {}}));
    EXPECT_TRUE(canBeChecked({std::nullopt, {listWithout(CodeKind::Confirmed, Answer::Read)}}));
}

TEST(CodeReportView, JsonHasNullForAListThatWasNotTold)
{
    CodeReport const report{std::nullopt,
                            {listWithCode(CodeKind::Confirmed), listWithout(CodeKind::Pending, Answer::Read),
                             listWithout(CodeKind::Permanent, Answer::Refused, "busy (21)")}};
    auto const json = nlohmann::json::parse(toJson(std::vector<ModuleCodes>{{0x7E8, "ECM", report}}))[0];
    EXPECT_EQ(json["id"], "7E8");
    EXPECT_TRUE(json["lamp"].is_null());
    EXPECT_EQ(json["confirmed"]["codes"][0]["code"], "P0133");
    EXPECT_TRUE(json["pending"]["codes"].empty());
    EXPECT_TRUE(json["pending"]["codes"].is_array());
    EXPECT_TRUE(json["permanent"]["codes"].is_null());
    EXPECT_EQ(json["permanent"]["answer"], "refused");
    EXPECT_EQ(json["permanent"]["reason"], "busy (21)");
}

TEST(CodeReportView, GivesMakersCodesTheMeaningOfTheMakerAlone)
{
    CodeReport report{true,
                      {{CodeKind::Confirmed,
                        Answer::Read,
                        {},
                        {{"P1131", "Powertrain", {{"Acura", "One"}, {"Volkswagen", "Two"}}, {}}}}},
                      {}};
    auto const text = [&report](MakerChoice::By by, std::string const& maker) {
        applyMaker(report, {by, maker});
        return toText(report, Style());
    };
    std::string const head = "  Lamp           on\n  Confirmed      1 code\n";
    std::string const unknown = head + "    P1131  -              maker-specific, 2 meanings\n";
    EXPECT_EQ(text(MakerChoice::By::Nothing, ""),
              unknown + "  Meanings       not known; --make MAKER names the maker, -v lists all\n");
    EXPECT_EQ(text(MakerChoice::By::Guess, "Volkswagen"),
              unknown + "  Meanings       not known; perhaps Volkswagen's: --make \"Volkswagen\"\n");
    std::string const known = head + "    P1131  Volkswagen     Two\n";
    EXPECT_EQ(text(MakerChoice::By::Option, "Volkswagen"), known + "  Meanings       Volkswagen's\n");
    EXPECT_EQ(text(MakerChoice::By::Vin, "Volkswagen"), known + "  Meanings       Volkswagen's, by the VIN\n");
    EXPECT_NE(toText(report, Style(false, true)).find("P1131  Acura          One\n"), std::string::npos)
        << "in detail all are shown";
    auto const json = toJsonValue(report);
    EXPECT_EQ(json["maker"].dump(), R"({"name":"Volkswagen","by":"VIN"})");
    EXPECT_EQ(json["confirmed"]["codes"][0]["meaning"]["text"], "Two");
    EXPECT_FALSE(hasMakersCodes({true, {listWithCode(CodeKind::Pending)}, {}}));
}

} // namespace
