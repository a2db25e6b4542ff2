// The two small files of the channel: what adapters were not given back, and what was learnt of adapters and vehicles.

#include "libvelmora/channel/learntstore.h"
#include "libvelmora/channel/returnnote.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class KeptFiles : public testing::Test
{
protected:
    std::filesystem::path write(std::string const& name, std::string const& text) const
    {
        std::ofstream(m_folder.path() / name) << text;
        return m_folder.path() / name;
    }

    testsupport::TemporaryFolder const m_folder;
};

using ReturnNotesFile = KeptFiles;
using LearntFile = KeptFiles;

TEST_F(ReturnNotesFile, IsReadLineByLine)
{
    ReturnNotes const notes(write("adapters.txt", "COM1\t6\tATSH7DF\tATCRA\n"
                                                  "\t6\tATSH7DF\n"
                                                  "COM2\t6\n"
                                                  "COM3\tx\trm\tATAR\n"
                                                  "COM4\n"));
    ASSERT_TRUE(notes.find("COM1"));
    EXPECT_EQ(notes.find("COM1")->protocol, 6);
    EXPECT_THAT(notes.find("COM1")->commands, ElementsAre("ATSH7DF", "ATCRA"));
    EXPECT_FALSE(notes.find(""));
    EXPECT_FALSE(notes.find("COM2")) << "nothing to give back";
    EXPECT_EQ(notes.find("COM3")->protocol, 0);
    EXPECT_THAT(notes.find("COM3")->commands, ElementsAre("ATAR")) << "only commands to the adapter";
    EXPECT_FALSE(notes.find("COM4"));
}

TEST_F(ReturnNotesFile, HoldsWhatWasPutUntilItIsStruckOut)
{
    std::filesystem::path const file = m_folder.path() / "new" / "adapters.txt";
    ReturnNotes const notes(file);
    notes.put("COM9", {6, {"ATCRA", "ATSH7DF"}});
    notes.put("COM1", {0, {"ATAR"}});
    EXPECT_EQ(m_folder.read("new/adapters.txt"), "COM1\t0\tATAR\nCOM9\t6\tATCRA\tATSH7DF\n");
    std::ofstream(file) << "COM5\t6\tATAR\n";
    EXPECT_FALSE(ReturnNotes(file).find("COM5")) << "it is read once in a process";
    notes.strike("COM7");
    EXPECT_EQ(m_folder.read("new/adapters.txt"), "COM5\t6\tATAR\n") << "of which there is no note";
    notes.strike("COM9");
    EXPECT_EQ(m_folder.read("new/adapters.txt"), "COM1\t0\tATAR\n");
    notes.strike("COM1");
    EXPECT_FALSE(std::filesystem::exists(file));
    EXPECT_FALSE(notes.find("COM1"));
    EXPECT_EQ(ReturnNotes::besides("/etc/x/settings.toml"), "/etc/x/adapters.txt");
}

TEST_F(ReturnNotesFile, IsNotNeeded)
{
    ReturnNotes const notes{std::filesystem::path()};
    notes.put("a port of this test alone", {6, {"ATAR"}});
    EXPECT_TRUE(ReturnNotes(std::filesystem::path()).find("a port of this test alone"));
    notes.strike("a port of this test alone");
    EXPECT_FALSE(notes.find("a port of this test alone"));
}

TEST_F(LearntFile, KeepsAllFromVisitToVisit)
{
    std::filesystem::path const file = m_folder.path() / "new" / "learnt.toml";
    {
        LearntStore store(file);
        EXPECT_EQ(store.protocol("x"), 0);
        EXPECT_TRUE(store.canCount("x"));
        EXPECT_EQ(store.wait("x").steps, 0U);
        EXPECT_FALSE(store.wait("x").isCut);
        store.setProtocol("x", 6);
        store.setCanCount("x", false);
        store.setWait("x", {25, true});
        store.setProtocol("y", 3);
        store.setWait("z", {30, false});
        EXPECT_EQ(store.protocol("z"), 0);
        store.setCounts("VIN", {{"010C", {{0x7E8, 1}, {0x7E9, 2}}}, {"0902", {{0x7E8, 3}}}});
        EXPECT_EQ(store.counts("VIN").size(), 2U);
        store.save();
    }
    EXPECT_THAT(m_folder.read("new/learnt.toml"), HasSubstr("'2024:1 2025:2'"));
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(m_folder.path() / "new"), {}), 1);
    LearntStore store(file);
    EXPECT_EQ(store.protocol("x"), 6);
    EXPECT_FALSE(store.canCount("x"));
    EXPECT_EQ(store.wait("x").steps, 25U);
    EXPECT_TRUE(store.wait("x").isCut);
    EXPECT_EQ(store.protocol("y"), 3);
    EXPECT_TRUE(store.canCount("y"));
    EXPECT_EQ(store.wait("y").steps, 0U);
    EXPECT_EQ(store.counts("VIN"),
              (std::map<std::string, FrameSet>{{"010C", {{0x7E8, 1}, {0x7E9, 2}}}, {"0902", {{0x7E8, 3}}}}));
    EXPECT_TRUE(store.counts("another").empty());
    store.forget();
    EXPECT_EQ(store.protocol("x"), 0);
    EXPECT_TRUE(store.counts("VIN").empty());
    EXPECT_FALSE(std::filesystem::exists(file));
    EXPECT_EQ(LearntStore::besides("/etc/x/settings.toml"), "/etc/x/learnt.toml");
}

TEST_F(LearntFile, IsTakenAsFarAsItIsUnderstood)
{
    LearntStore const store(write("learnt.toml",
                                  "[adapter.long]\nwait = 255\n[adapter.longer]\nwait = 256\ncut = true\n"
                                  "[adapter.short]\nwait = 1\n[adapter.none]\nwait = 0\n"
                                  "[adapter.bus]\nprotocol = 9\n[adapter.nobus]\nprotocol = 10\n"
                                  "[vehicle.v]\n0100 = '2024:1'\n0120 = '2024:1 2025'\n0140 = ''\n"));
    EXPECT_EQ(store.wait("long").steps, 255U);
    EXPECT_FALSE(store.wait("long").isCut);
    EXPECT_EQ(store.wait("longer").steps, 0U);
    EXPECT_EQ(store.wait("short").steps, 1U);
    EXPECT_EQ(store.wait("none").steps, 0U);
    EXPECT_EQ(store.wait("bus").steps, 0U) << "of which nothing is told";
    EXPECT_EQ(store.protocol("bus"), 9);
    EXPECT_EQ(store.protocol("nobus"), 0);
    EXPECT_EQ(store.protocol("long"), 0);
    EXPECT_EQ(store.counts("v").size(), 2U) << "and that whose end is cut";
}

TEST_F(LearntFile, OfMoreThanAMegabyteIsNotOurs)
{
    std::string const head = "[adapter.x]\nprotocol = 6\n#";
    for (std::size_t const size : {1U << 20U, (1U << 20U) + 1}) {
        LearntStore const store(write("learnt.toml", head + std::string(size - head.size(), ' ')));
        EXPECT_EQ(store.protocol("x"), size == 1U << 20U ? 6 : 0);
    }
}

TEST_F(LearntFile, IsNotWrittenWithoutAName)
{
    std::filesystem::path const before = std::filesystem::current_path();
    std::filesystem::current_path(m_folder.path());
    LearntStore store("");
    store.setProtocol("x", 6);
    store.save();
    std::filesystem::current_path(before);
    EXPECT_TRUE(std::filesystem::is_empty(m_folder.path()));
}

} // namespace

} // namespace velmora
