#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/signals.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace velmora;

constexpr char const* soundSignals = R"([[signal]]
id = "GEAR"
name = "Gear"
header = "7E1"
request = "220102"
formula = "A"
)";

using testsupport::TemporaryFolder;

class SignalListingTest : public testing::Test
{
protected:
    std::string write(std::string const& text, char const* name = "file.toml") const
    {
        std::ofstream(m_folder.file(name)) << text;
        return m_folder.file(name);
    }

    TemporaryFolder const m_folder;
};

TEST_F(SignalListingTest, TellsWhatIsInAFileAndWritesItAgain)
{
    SignalListing const listing = listSignals(write(soundSignals));
    ASSERT_EQ(listing.signals.size(), 1U);
    EXPECT_EQ(listing.path, m_folder.file("file.toml"));
    EXPECT_EQ(listing.signals[0].id, "GEAR");
    EXPECT_EQ(listing.signals[0].request, (std::vector<unsigned char>{0x22, 0x01, 0x02}));
    EXPECT_EQ(nlohmann::json::parse(listing.json)["signals"][0]["request"], "220102");
    EXPECT_EQ(listSignals(write(listing.toml)).json, listing.json);
}

TEST_F(SignalListingTest, TellsMistakesOrThrowsThem)
{
    std::string const path = write(std::string(soundSignals) + "[[signal]]\nid = \"BAD\"\nformula = \"A +\"\n");
    SignalListing const checked = checkSignals(path);
    EXPECT_EQ(checked.signals.size(), 1U);
    ASSERT_FALSE(checked.mistakes.empty());
    EXPECT_NE(toText(checked.mistakes[0], path).find("file.toml:"), std::string::npos);
    EXPECT_THROW(listSignals(path), Error);
    EXPECT_THROW(checkSignals(path + ".missing"), Error);
}

TEST_F(SignalListingTest, ConvertsAndTellsWhatWasLeftOut)
{
    std::string const path = write("Name,ShortName,ModeAndPID,Equation,Min Value,Max Value,Units,Header\n"
                                   "Gear,GEAR,220102,A,0,8,,7E1\n"
                                   "Lock,LOCK,2E0102,A,0,8,,7E1\n",
                                   "app.csv");
    SignalListing const converted = convertSignals(path);
    EXPECT_EQ(converted.signals.size(), 1U);
    EXPECT_EQ(converted.mistakes.size(), 1U) << "2E writes";
    EXPECT_EQ(listSignals(write(converted.toml)).signals.size(), 1U);
}

} // namespace
