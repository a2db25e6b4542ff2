#include "libobd/catalogue/dtcreader.h"
#include "tests/support/dtcrows.h"
#include "tests/support/logcapture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <stdexcept>
#include <thread>

namespace {

using obd::DtcDataModel;
using obd::DtcReader;
using obd::Manufacturer;
using support::LoadedCodes;
using support::loadRows;
using testing::ElementsAre;

using Models = std::vector<std::shared_ptr<DtcDataModel>>;

// "code | description | system | manufacturer".
std::string text(DtcDataModel const& model)
{
    return model.code + " | " + model.description + " | " + model.system + " | " + model.manufacturer;
}

std::vector<std::string> texts(Models const& models)
{
    std::vector<std::string> all;
    for (auto const& model : models) {
        all.push_back(text(*model));
    }
    return all;
}

std::vector<std::string> meanings(std::string const& code)
{
    return texts(DtcReader().getTroubleCodes(code));
}

std::vector<std::string> makers(std::string const& code)
{
    std::vector<std::string> all;
    for (auto const& model : DtcReader().getTroubleCodes(code)) {
        all.push_back(model->manufacturer);
    }
    return all;
}

TEST(DtcDataModel, HoldsItsFourTextsAndCopiesThem)
{
    DtcDataModel const model("P0420", "Catalyst", "Powertrain", "Generic");
    DtcDataModel const copy(model);
    EXPECT_EQ(text(copy), "P0420 | Catalyst | Powertrain | Generic");
}

TEST(DtcDataModel, LeavesTheMakerEmptyWhereItIsNotTold)
{
    EXPECT_EQ(text(DtcDataModel("P0420", "Catalyst", "Powertrain")), "P0420 | Catalyst | Powertrain | ");
}

TEST(DtcReader, P0420GivesOneGenericModel)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("P0420"),
                ElementsAre("P0420 | Catalyst System Efficiency Below Threshold Bank 1 | Powertrain | Generic"));
}

TEST(DtcReader, P1000GivesTheMeaningsOfAllItsMakersInTheirOrder)
{
    LoadedCodes const codes;
    Models const models = DtcReader().getTroubleCodes("P1000");
    std::vector<std::string> all = texts(models);
    for (char const* sample : {
             "P1000 | Cooling System Heat Valve Control Circuit | Powertrain | Chrysler",
             "P1000 | Cooling System Heat Valve Control Circuit | Powertrain | Dodge",
             "P1000 | OBD-II Monitor Testing Incomplete | Powertrain | Ford",
             "P1000 | OBD Systems Readiness Test Not Complete | Powertrain | Jaguar",
             "P1000 | Cooling System Heat Valve Control Circuit | Powertrain | Jeep",
             "P1000 | Engine Control Module Memory Erased | Powertrain | Land Rover",
         }) {
        EXPECT_THAT(all, testing::Contains(sample));
    }
    std::vector<int> order;
    for (auto const& model : models) {
        for (int maker = 0; maker <= Manufacturer::Volvo; ++maker) {
            if (Manufacturer::manufacturerToString(static_cast<Manufacturer::AutoManufacturer>(maker)) ==
                model->manufacturer) {
                order.push_back(maker);
            }
        }
    }
    EXPECT_EQ(order.size(), models.size());
    EXPECT_TRUE(std::is_sorted(order.begin(), order.end()));
}

TEST(DtcReader, ACodeListedTwiceUnderOneMakerGivesTwoModels)
{
    LoadedCodes const codes{{11, "P1120", "Throttle"}, {11, "P1120", "Throttle"}, {11, "P1120", "Pedal"}};
    EXPECT_THAT(meanings("P1120"),
                ElementsAre("P1120 | Throttle | Powertrain | Fiat", "P1120 | Throttle | Powertrain | Fiat",
                            "P1120 | Pedal | Powertrain | Fiat"));
}

TEST(DtcReader, P1FFFIsUnknownAndTheMakersOwn)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("P1FFF"), ElementsAre("P1FFF | Unknown Trouble Code | Powertrain | Unknown"));
}

TEST(DtcReader, P0FFFIsReserved)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("P0FFF"), ElementsAre("P0FFF | ISO/SAE Reserved | Powertrain | Generic"));
}

TEST(DtcReader, U3FFFIsUnknownThoughGenericRowsBeginWithU3)
{
    LoadedCodes const codes;
    EXPECT_THAT(makers("U3000"), ElementsAre("Generic"));
    EXPECT_THAT(meanings("U3FFF"), ElementsAre("U3FFF | Unknown Trouble Code | Network | Unknown"));
}

TEST(DtcReader, GenericCodeOfP1000IsReservedThoughMakersKnowIt)
{
    LoadedCodes const codes;
    EXPECT_EQ(text(*DtcReader().getGenericCode("P1000")), "P1000 | ISO/SAE Reserved | Powertrain | Generic");
}

TEST(DtcReader, X1234IsReservedAndItsSystemUndefined)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("X1234"), ElementsAre("X1234 | ISO/SAE Reserved | Undefined | Generic"));
}

TEST(DtcReader, TextsOfLessThanTwoCharactersThrow)
{
    LoadedCodes const codes;
    EXPECT_THROW(DtcReader().getTroubleCodes("P"), std::out_of_range);
    EXPECT_THROW(DtcReader().getTroubleCodes("X"), std::out_of_range);
    EXPECT_THROW(DtcReader().getTroubleCodes(""), std::out_of_range);
}

TEST(DtcReader, TheTableStaysUsableBehindAThrow)
{
    LoadedCodes const codes;
    EXPECT_THROW(DtcReader().getTroubleCodes("P"), std::out_of_range);
    DtcReader::clean(); // would wait for ever for a lock that was left
    EXPECT_TRUE(DtcReader::init());
}

TEST(DtcReader, GenericCodeOfTextsOfLessThanTwoCharactersIsReserved)
{
    LoadedCodes const codes;
    EXPECT_EQ(text(*DtcReader().getGenericCode("P")), "P | ISO/SAE Reserved | Powertrain | Generic");
    EXPECT_EQ(text(*DtcReader().getGenericCode("")), " | ISO/SAE Reserved | Undefined | Generic");
}

TEST(DtcReader, CodesCompareExactly)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("p0420"), ElementsAre("p0420 | ISO/SAE Reserved | Undefined | Generic"));
    EXPECT_THAT(meanings("P0420 "), ElementsAre("P0420  | ISO/SAE Reserved | Powertrain | Generic"));
}

TEST(DtcReader, AfterCleanOnlyTheDefaultsAreLeft)
{
    EXPECT_TRUE(DtcReader::init());
    std::shared_ptr<DtcDataModel> const kept = DtcReader().getTroubleCodes("P0420").front();
    DtcReader::clean();
    EXPECT_THAT(meanings("P0420"), ElementsAre("P0420 | ISO/SAE Reserved | Powertrain | Generic"));
    EXPECT_EQ(text(*DtcReader().getGenericCode("P0420")), "P0420 | ISO/SAE Reserved | Powertrain | Generic");
    EXPECT_TRUE(DtcReader().getTroubleCodes().empty());
    EXPECT_EQ(kept->description, "Catalyst System Efficiency Below Threshold Bank 1");
}

TEST(DtcReader, LoadsTheBuiltInTable)
{
    LoadedCodes const codes;
    std::set<std::string> allCodes;
    for (obd::DtcRow const& row : obd::DtcTable()) {
        allCodes.insert(row.code);
    }
    EXPECT_EQ(DtcReader().getTroubleCodes().size(), allCodes.size());
    for (std::size_t i = 0; i < obd::DtcTable::size(); i += 97) {
        obd::DtcRow const row = obd::DtcTable::row(i);
        auto const maker = static_cast<Manufacturer::AutoManufacturer>(row.maker);
        EXPECT_THAT(meanings(row.code), testing::Contains(std::string(row.code) + " | " + row.text + " | " +
                                                          DtcReader().getSystem(row.code) + " | " +
                                                          Manufacturer::manufacturerToString(maker)));
    }
}

TEST(DtcReader, ASecondInitDoublesAllRows)
{
    LoadedCodes const codes;
    EXPECT_TRUE(DtcReader::init());
    EXPECT_THAT(makers("P0420"), ElementsAre("Generic", "Generic"));
    EXPECT_EQ(makers("P1000").size() % 2, 0U);
}

TEST(DtcReader, RowsThatComeLaterStandBehindTheirMakersEarlierOnes)
{
    LoadedCodes const codes{{12, "P1000", "Ford one"}, {12, "P1000", "Ford two"}, {44, "P1000", "Volvo one"}};
    loadRows({{12, "P1000", "Ford three"}, {0, "P1000", "Anybody"}, {44, "P1000", "Volvo two"}});
    std::vector<std::string> descriptions;
    for (auto const& model : DtcReader().getTroubleCodes("P1000")) {
        descriptions.push_back(model->description);
    }
    EXPECT_THAT(descriptions, ElementsAre("Anybody", "Ford one", "Ford two", "Ford three", "Volvo one", "Volvo two"));
}

TEST(DtcReader, TheGenericMeaningComesFirst)
{
    LoadedCodes const codes{{0, "P0100", "Air flow"}, {0, "P0420", "Catalyst"}, {3, "P0420", "Catalyst of Audi"}};
    EXPECT_THAT(makers("P0420"), ElementsAre("Generic", "Audi"));
    EXPECT_EQ(text(*DtcReader().getGenericCode("P0420")), "P0420 | Catalyst | Powertrain | Generic");
}

TEST(DtcReader, ATableWithoutRowsIsToldAndLoadsNothing)
{
    EXPECT_FALSE(loadRows({}));
    EXPECT_TRUE(DtcReader().getTroubleCodes().empty());
}

TEST(DtcReader, LookupsShareTheirModelsSaveTheGenericOne)
{
    LoadedCodes const codes{{0, "P0420", "Catalyst"}};
    EXPECT_EQ(DtcReader().getTroubleCodes("P0420").front(), DtcReader().getTroubleCodes("P0420").front());
    EXPECT_NE(DtcReader().getGenericCode("P0420"), DtcReader().getTroubleCodes("P0420").front());
    EXPECT_NE(DtcReader().getGenericCode("P0420"), DtcReader().getGenericCode("P0420"));
}

TEST(DtcReader, AllCodesComeOnceSortedWithTheirFirstMeaning)
{
    LoadedCodes const codes{{0, "P0420", "Catalyst"},   {0, "B0001", "Airbag"},      {3, "P0420", "Catalyst of Audi"},
                            {3, "P1000", "Audi's own"}, {12, "P1000", "Ford's own"}, {12, "C1000", "Brakes"}};
    EXPECT_THAT(texts(DtcReader().getTroubleCodes()),
                ElementsAre("B0001 | Airbag | Body | Generic", "C1000 | Brakes | Chassis | Ford",
                            "P0420 | Catalyst | Powertrain | Generic", "P1000 | Audi's own | Powertrain | Audi"));
}

TEST(DtcReader, TheFirstLetterTellsTheSystem)
{
    DtcReader const reader;
    EXPECT_EQ(reader.getSystem("P0420"), "Powertrain");
    EXPECT_EQ(reader.getSystem("B0001"), "Body");
    EXPECT_EQ(reader.getSystem("C0035"), "Chassis");
    EXPECT_EQ(reader.getSystem("U0101"), "Network");
    EXPECT_EQ(reader.getSystem("p0420"), "Undefined");
    EXPECT_EQ(reader.getSystem(""), "Undefined");
}

TEST(DtcReader, UnknownCodesOfTheMakersRangesAreToldApart)
{
    static constexpr struct
    {
        char letter;
        char const* makersDigits;
    } ranges[] = {{'P', "13"}, {'B', "12"}, {'C', "12"}, {'U', "123"}};
    for (auto const& range : ranges) {
        for (char const digit : std::string("0123")) {
            std::string const code = std::string(1, range.letter) + digit + "FFF";
            bool const makersOwn = std::string(range.makersDigits).find(digit) != std::string::npos;
            EXPECT_THAT(makers(code), ElementsAre(makersOwn ? "Unknown" : "Generic")) << code;
        }
    }
}

TEST(DtcReader, MalformedRowsStayFindableByTheirOwnText)
{
    LoadedCodes const codes;
    EXPECT_THAT(meanings("P1300]"), ElementsAre("P1300] | Ignitor Circuit | Powertrain | Buick"));
    EXPECT_THAT(makers("P15O9"), ElementsAre("Land Rover"));
}

TEST(DtcReader, NothingIsLogged)
{
    support::LogCapture const log;
    LoadedCodes const codes;
    meanings("P1FFF");
    EXPECT_THROW(meanings("P"), std::out_of_range);
    EXPECT_TRUE(log.lines().empty());
}

TEST(DtcReader, ReadersRunBesideLoadingAndCleaning)
{
    std::vector<std::thread> readers;
    for (int i = 0; i < 2; ++i) {
        readers.emplace_back([] {
            for (int round = 0; round < 100; ++round) {
                EXPECT_EQ(DtcReader().getTroubleCodes("P0420").size(), 1U);
                EXPECT_EQ(DtcReader().getGenericCode("P0420")->manufacturer, "Generic");
                EXPECT_LE(DtcReader().getTroubleCodes().size(), 2U);
            }
        });
    }
    for (int i = 0; i < 20; ++i) {
        LoadedCodes const codes{{0, "P0420", "Catalyst"}, {0, "P0430", "Catalyst"}};
        std::this_thread::yield();
    }
    for (auto& reader : readers) {
        reader.join();
    }
}

} // namespace
