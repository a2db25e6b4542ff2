#include "libvelmora/uds/modulescan.h"
#include "tests/support/modulebench.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>

namespace velmora {

namespace {

using testing::Contains;
using testing::HasSubstr;
using testing::Not;

// A vehicle that stands, with traffic of others on two identifiers.
class ModuleScanTest : public testing::Test
{
protected:
    ModuleScanTest()
    {
        m_bench.answer("01 0D", "41 0D 00");
        m_bench.module("700", "ATMA", {"720 01 02 03", "7A5 11 22", "not a frame"});
    }

    std::vector<FoundModule> find()
    {
        ModuleScan scan(
            m_asker, [] {}, nullptr);
        return scan.find();
    }
    std::string failure()
    {
        try {
            find();
        } catch (Error const& error) {
            return error.what();
        }
        return "none";
    }

    support::FakeClock m_clock;
    support::ModuleBench m_bench{&m_clock};
    ModuleAsker m_asker{m_bench, m_bench};
};

TEST_F(ModuleScanTest, AsksIdentifiersThatNobodyUses)
{
    m_bench.module("743", "3E00", {"763027E00"}).module("760", "3E00", {"761037F3E11"});
    std::vector<FoundModule> const found = find();
    ASSERT_EQ(found.size(), 2U);
    EXPECT_EQ(found[0].request, "743");
    EXPECT_EQ(found[0].reply, "763");
    EXPECT_EQ(found[1].request, "760") << "a refusal shows a module, too";
    std::vector<std::string> const asked = m_bench.takeAsked();
    EXPECT_EQ(asked.front(), "700 ATMA") << "it listens first";
    for (char const* const id : {"700", "7DE", "7E0", "7E7"}) {
        EXPECT_THAT(asked, Contains(std::string(id) + " 3E00"));
    }
    // Heard, everyone's, replies of OBD modules, and those of the modules just found.
    for (char const* const id : {"720", "7A5", "7DF", "7E8", "7EF", "763", "761", "7F0"}) {
        EXPECT_THAT(asked, Not(Contains(std::string(id) + " 3E00")));
    }
    EXPECT_EQ(std::count_if(asked.begin(), asked.end(), [](std::string const& each) { return each.ends_with("3E00"); }),
              0xE8 - 5);
}

TEST_F(ModuleScanTest, AsksTheOtherLengthOnTheOtherBus)
{
    m_bench.setProtocol(obd::ObdProtocolCan29);
    m_bench.module("18DA60F1", "3E00", {"18DAF160027E00"});
    std::vector<FoundModule> const found = find();
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0].reply, "18DAF160");
    std::vector<std::string> const asked = m_bench.takeAsked();
    EXPECT_THAT(asked, Contains("18DAFFF1 3E00"));
    EXPECT_THAT(asked, Not(Contains("18DAF1F1 3E00"))) << "the tester itself";
    EXPECT_THAT(asked, Not(Contains("700 3E00")));
}

TEST_F(ModuleScanTest, EndsWhereTheVehicleMovesOrTheBusIsInTrouble)
{
    m_bench.answer("01 0D", "41 0D 05");
    EXPECT_THAT(failure(), HasSubstr("moves (5 km/h)"));
    EXPECT_TRUE(m_bench.takeAsked().empty()) << "before anything was asked";
    m_bench.answer("01 0D", "41 0D 00");
    for (char const* const id : {"701", "702", "703"}) {
        m_bench.module(id, "3E00", {"CAN ERROR"});
    }
    EXPECT_THAT(failure(), HasSubstr("trouble on the bus"));
    EXPECT_EQ(m_bench.takeAsked().back(), "703 3E00");
    m_bench.setProtocol(obd::ObdProtocolJ1850);
    EXPECT_THAT(failure(), HasSubstr("no CAN"));
}

} // namespace

} // namespace velmora
