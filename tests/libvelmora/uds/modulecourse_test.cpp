// What is remembered of modules, what they tell of themselves, and how they are looked for.
#include "libvelmora/uds/moduleidentity.h"
#include "libvelmora/uds/modulescan.h"
#include "libvelmora/uds/modulestore.h"
#include "tests/support/modulebench.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::Pair;

TEST(ModuleStore, KeepsAFileForPeopleToRead)
{
    testsupport::TemporaryFolder const folder;
    ModuleStore const store(folder.path() / "new" / "modules.json");
    store.keep("A", {{"743", "763", "Gerät", "28400", "0023", 2U}, {"744", "764", "", "", "", {}}});
    store.keep("A", {{"743", "763", "Gerät", "28400", "0023", 2U}});
    store.keep("B", {{"7E0", "7E8", "", "", "", {}, {{0xF18C, "S1"}, {0x1A80, "X"}}}});
    EXPECT_EQ(folder.read("new/modules.json"), R"({
  "A": [
    {
      "codes": 2,
      "name": "Gerät",
      "part": "28400",
      "reply": "763",
      "request": "743",
      "software": "0023"
    }
  ],
  "B": [
    {
      "codes": null,
      "identifiers": {
        "1A80": "X",
        "F18C": "S1"
      },
      "name": null,
      "part": null,
      "reply": "7E8",
      "request": "7E0",
      "software": null
    }
  ]
}
)");
    FoundModule const module = store.find("A")->at(0);
    EXPECT_EQ(module.request, "743");
    EXPECT_EQ(module.name, "Gerät");
    EXPECT_EQ(module.part, "28400");
    EXPECT_EQ(module.software, "0023");
    store.keep("", {});
    EXPECT_FALSE(store.find("")) << "who tells no VIN may be anyone";
    EXPECT_FALSE(store.find("C"));
    EXPECT_EQ(ModuleStore::besides("/a/settings.toml"), "/a/modules.json");
    std::filesystem::create_directories(folder.path() / "taken" / "inside");
    EXPECT_THROW(ModuleStore(folder.path() / "taken").keep("A", {}), Error) << "there is a folder of that name";
    std::filesystem::create_symlink("/dev/full", folder.file("full.json.new"));
    EXPECT_THROW(ModuleStore(folder.path() / "full.json").keep("A", {}), Error);
    EXPECT_FALSE(std::filesystem::exists(folder.path() / "full.json"));
}

TEST(ModuleStore, PassesOverWhatIsNoModule)
{
    testsupport::TemporaryFolder const folder;
    ModuleStore const store(folder.path() / "modules.json");
    std::ofstream(folder.file("modules.json"))
        << R"({"A": [1, {"request": "7E0"}, {"reply": "7E8"}, {"request": "7E1", "reply": 5},
                     {"request": "7E2", "reply": "7EA", "name": 5, "part": null, "codes": -1},
                     {"request": "7E3", "reply": "7EB", "codes": 3}], "B": 5})";
    std::vector<FoundModule> const modules = store.find("A").value();
    ASSERT_EQ(modules.size(), 2U);
    EXPECT_EQ(modules[0].reply, "7EA");
    EXPECT_EQ(modules[0].name, "");
    EXPECT_EQ(modules[0].codes, std::nullopt);
    EXPECT_EQ(modules[1].codes, 3U);
    EXPECT_FALSE(store.find("B"));
}

TEST(ModuleIdentity, TakesNoEmptyTextForOne)
{
    support::ModuleBench bench;
    ModuleAsker asker(bench, bench);
    bench.module("7E0", "22F197", {"7E80662F19745434D"}).module("7E0", "22F187", {"7E80362F187"});
    bench.module("7E1", "22F197", {"7E9037F2211"}).module("7E1", "1A80", {"7E9025A80"});
    bench.module("7E1", "1A90", {"7E9035A9041"});
    FoundModule module{"7E0", "7E8", {}, {}, {}, {}};
    ModuleIdentity(asker, [] {}).identify(module);
    EXPECT_EQ(module.name, "ECM");
    EXPECT_EQ(module.part, "");
    FoundModule older{"7E1", "7E9", {}, {}, {}, {}};
    ModuleIdentity(asker, [] {}).identify(older);
    EXPECT_THAT(older.identifiers, ElementsAre(Pair(0x1A90U, "A")));
    bench.module("7E2", "22F197", {"7EA037F2231"}).module("7E2", "22F187", {"7EA0562F1874142"});
    ModuleIdentity identity(asker, [] {});
    identity.identify(older);
    FoundModule next{"7E2", "7EA", {}, {}, {}, {}};
    identity.identify(next);
    EXPECT_EQ(next.part, "AB") << "one identifier is missing, not the service; nor does the module before matter";
    identity.identify(older);
    identity.readIdentifiers(next);
    EXPECT_EQ(next.identifiers.at(0xF187), "AB");
    FoundModule elsewhere{"18DA10F1", "", {}, {}, {}, {}};
    ModuleIdentity(asker, [] {}).readIdentifiers(elsewhere);
    EXPECT_TRUE(elsewhere.identifiers.empty()) << "no module of this bus";
}

class ModuleScanCourse : public testing::Test
{
protected:
    ModuleScanCourse() { m_bench.answer("01 0D", "41 0D 00"); }

    std::string run()
    {
        ModuleScan scan(
            m_asker, [this] { m_check(); },
            [this](ScanProgress const& progress) {
                m_progress += fmt::format("{}/{}/{} ", progress.done, progress.all, progress.found);
            });
        try {
            m_found = scan.find();
        } catch (Error const& error) {
            return error.what();
        }
        return "done";
    }

    support::FakeClock m_clock;
    support::ModuleBench m_bench{&m_clock};
    ModuleAsker m_asker{m_bench, m_bench};
    std::function<void()> m_check = [] {};
    std::string m_progress;
    std::vector<FoundModule> m_found;
};

TEST_F(ModuleScanCourse, TellsHowFarItIsAndStopsWhenToldTo)
{
    m_bench.module("700", "ATMA", {"7A6", "7A7 1"});
    m_bench.module("701", "3E00", {"721027E00"});
    m_check = [this] {
        if (m_bench.addresses().size() > 3) {
            throw Error(ErrorKind::Interrupted, "Interrupted");
        }
    };
    EXPECT_EQ(run(), "Interrupted");
    EXPECT_EQ(m_progress, "0/230/0 1/230/0 2/230/1 ") << "a line that is an identifier alone was not heard";
    RequestAddress const& listened = m_bench.addresses().at(0);
    EXPECT_EQ(listened.reply, "7XX");
    RequestAddress const& asked = m_bench.addresses().at(1);
    EXPECT_EQ(asked.waitMs, 100U);
    EXPECT_TRUE(asked.stays);
    EXPECT_EQ(asked.reply, "7XX");
    EXPECT_EQ(ScanProgress().done + ScanProgress().all + ScanProgress().found, 0U);
}

TEST_F(ModuleScanCourse, ListensOnTheLongIdentifiers)
{
    m_bench.setProtocol(obd::ObdProtocolCan29);
    m_bench.module("18DA10F1", "ATMA", {"18DA20F1 02 3E 00"});
    EXPECT_EQ(run(), "done");
    std::vector<std::string> const asked = m_bench.takeAsked();
    EXPECT_EQ(asked.at(0), "18DA10F1 ATMA");
    EXPECT_EQ(m_bench.addresses().at(0).reply, "18DAXXXX");
    EXPECT_EQ(asked.at(1), "18DA00F1 3E00");
    EXPECT_EQ(m_bench.addresses().at(1).reply, "18DAF1XX");
    EXPECT_THAT(asked, testing::Not(testing::Contains("18DA20F1 3E00")));
    EXPECT_EQ(asked.size(), 255U);
}

TEST_F(ModuleScanCourse, LooksEachSixteenRequestsWhetherTheVehicleStands)
{
    int left = 5;
    m_check = [this, &left] {
        m_clock.advance(1000);
        if (left-- == 0) {
            m_bench.answer("01 0D", "41 0D 07");
        }
    };
    EXPECT_EQ(run(), "The vehicle moves (7 km/h)");
    EXPECT_EQ(m_bench.takeAsked().back(), "70F 3E00");
}

TEST_F(ModuleScanCourse, EndsWithAnAdapterThatCantAskThem)
{
    m_bench.refuseAddress("ATSH");
    EXPECT_EQ(run(), "The adapter does not know ATSH");
}

} // namespace

} // namespace velmora
