// The texts and documents of the companion's face, which applications and the program print.

#include "tests/support/temporaryfolder.h"

#include <velmora/catalogue.h>
#include <velmora/document.h>
#include <velmora/error.h>
#include <velmora/vin.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace velmora;

VehicleReport handedVehicle()
{
    VehicleReport report;
    ModuleReport module;
    module.id = 0x7E8;
    module.name = "ECM";
    module.info.vin = "1HGCM82633A004352";
    module.codes.lamp = true;
    report.modules.push_back(module);
    return report;
}

std::string contentOf(std::filesystem::path const& file)
{
    std::ostringstream text;
    text << std::ifstream(file).rdbuf();
    return text.str();
}

TEST(HandedReport, HidesTheVinInEachFormWhereThatIsWanted)
{
    std::filesystem::path const folder = testsupport::ownPath("handedreport");
    std::filesystem::remove_all(folder);
    std::filesystem::create_directories(folder);
    DocumentOptions options;
    options.maskVin = true;
    options.inspection = InspectionRule::UkMot;
    for (char const* const ending : {"html", "md", "json", "txt"}) {
        std::string const file = (folder / (std::string("car.") + ending)).string();
        writeDocument(file, handedVehicle(), options);
        std::string const text = contentOf(file);
        EXPECT_NE(text.find("1HGCM82633A000000"), std::string::npos) << ending;
        EXPECT_EQ(text.find("004352"), std::string::npos) << ending;
        EXPECT_THROW(checkDocument(file), Error);
        EXPECT_NO_THROW(checkDocument(file, true));
    }
    EXPECT_THROW(checkDocument((folder / "car.pdf").string()), Error);
    std::filesystem::remove_all(folder);
    EXPECT_EQ(toText(handedVehicle(), options, {}).find("004352"), std::string::npos);
    EXPECT_EQ(toJson(handedVehicle(), options).find("004352"), std::string::npos);
    EXPECT_NE(toJson(handedVehicle(), {}).find("004352"), std::string::npos);
}

TEST(HandedReport, TellsAnInspectionOnlyWhereOneIsWished)
{
    DocumentOptions options;
    EXPECT_FALSE(nlohmann::json::parse(toJson(handedVehicle(), options)).contains("inspection"));
    std::string const without = toText(handedVehicle(), options, {});
    options.inspection = InspectionRule::DeAu;
    EXPECT_TRUE(nlohmann::json::parse(toJson(handedVehicle(), options)).contains("inspection"));
    EXPECT_GT(toText(handedVehicle(), options, {}).size(), without.size());
}

TEST(CataloguesFace, KeepsOneMakersMeanings)
{
    TroubleCode const ford = explain("p1260", "Ford");
    EXPECT_EQ(ford.code, "P1260");
    EXPECT_EQ(ford.maker, "Ford");
    ASSERT_EQ(ford.meanings.size(), 1U);
    EXPECT_EQ(ford.meanings[0].maker, "Ford");
    EXPECT_GT(explain("P1260").meanings.size(), 1U);
    TroubleCode const unknown = explain("P3FFF", "Ford");
    ASSERT_EQ(unknown.meanings.size(), 1U);
    EXPECT_EQ(unknown.meanings[0].text, "Unknown Trouble Code");
    EXPECT_THROW(explain("P04", "Ford"), Error);
}

TEST(CataloguesFace, FindsRowsByTheBeginningsOfWords)
{
    CatalogueUse const use;
    auto const rows = findRows({"P0420"}, "Generic");
    ASSERT_EQ(rows.size(), 1U);
    EXPECT_EQ(rows[0].code, "P0420");
    EXPECT_EQ(rows[0].system, "Powertrain");
    EXPECT_EQ(rows[0].maker, "Generic");
    EXPECT_NE(rows[0].text.find("Catalyst"), std::string::npos);
    EXPECT_TRUE(findRows({"P0420", "nosuchword"}).empty());
    EXPECT_EQ(findMaker("ford"), "Ford");
    EXPECT_THROW(findMaker("nobody"), Error);
}

TEST(VinsFace, TellsWhatANumberSays)
{
    VinFacts const facts = explainVin(" 1hgcm826-33a004352 ");
    EXPECT_EQ(facts.vin, "1HGCM82633A004352");
    EXPECT_EQ(facts.checkDigit, VinFacts::CheckDigit::Right);
    EXPECT_EQ(facts.years, std::vector<int>{2003});
    EXPECT_EQ(nlohmann::json::parse(toJson(facts)).at("vin"), facts.vin);
    EXPECT_NE(toText(facts, TextStyle()).find("2003"), std::string::npos);
    EXPECT_THROW(explainVin("1HGCM82633A00435"), Error);
}

TEST(TopicsFace, TellsTextsAndDocumentsOfAllModules)
{
    std::vector<ModuleTopic<CodeReport>> codes(2);
    codes[0].id = 0x7E8;
    codes[0].name = "ECM";
    codes[0].report.lamp = true;
    codes[1].id = 0x7E9;
    std::string const text = toText(codes, TextStyle{});
    EXPECT_EQ(text, "Control module 7E8: ECM\n  Lamp           on\n\nControl module 7E9\n  Lamp           -\n");
    EXPECT_NE(toText(codes, TextStyle{true, false, 0}), text) << "with colours";
    auto const document = nlohmann::json::parse(toJson(codes));
    ASSERT_EQ(document.size(), 2U);
    EXPECT_EQ(document[0].at("lamp"), true);
    EXPECT_TRUE(document[1].at("name").is_null());

    ModuleTopic<RoutineRun> const run{0x7E8, "ECM", {{1, "Leak test", ""}, RoutineRun::Result::Accepted, ""}};
    EXPECT_EQ(toText(run, {}).substr(0, 24), "Control module 7E8: ECM\n");
    EXPECT_EQ(nlohmann::json::parse(toJson(run)).size(), 1U);
}

} // namespace
