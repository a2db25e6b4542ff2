#include "libvelmora/record/dialoguefile.h"
#include "tests/support/filelimit.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <sys/stat.h>

using namespace velmora;

namespace {

class DialogueFileTest : public testing::Test
{
protected:
    void SetUp() override { std::filesystem::create_directory(m_folder); }
    void TearDown() override { std::filesystem::remove_all(m_folder); }

    std::filesystem::path const m_folder =
        testsupport::ownPath(testing::UnitTest::GetInstance()->current_test_info()->name());
    std::filesystem::path const m_path = m_folder / "car.dialogue";
};

TEST_F(DialogueFileTest, holdsWhatWasSaved)
{
    obdsim::Dialogue dialogue;
    dialogue.vehicle = "a car";
    dialogue.adapter = "an adapter";
    dialogue.exchanges.push_back({"ATI", {{obdsim::Time(0), "ELM327 v1.5\r\r>"}}});
    {
        DialogueFile file(m_path);
        file.save(dialogue);
    }
    EXPECT_EQ(obdsim::loadDialogue(m_path.string()).exchanges.at(0).received(), "ELM327 v1.5\r\r>");
}

TEST_F(DialogueFileTest, leavesNoEmptyFile)
{
    {
        DialogueFile const file(m_path);
        EXPECT_TRUE(std::filesystem::exists(m_path));
    }
    EXPECT_FALSE(std::filesystem::exists(m_path));
}

TEST_F(DialogueFileTest, replacesNoFile)
{
    std::ofstream(m_path) << "an older recording";
    try {
        DialogueFile const file(m_path);
        FAIL() << "opened";
    } catch (Error const& failure) {
        EXPECT_EQ(failure.kind(), ErrorKind::WrongUse);
        EXPECT_NE(std::string(failure.what()).find("exists already"), std::string::npos);
    }
    EXPECT_TRUE(std::filesystem::exists(m_path));
}

TEST_F(DialogueFileTest, isAPlainFileThatIsHeldUntilItIsSaved)
{
    ASSERT_EQ(::mkfifo((m_folder / "pipe").c_str(), 0600), 0);
    try {
        DialogueFile const file(m_folder / "pipe");
        FAIL() << "opened";
    } catch (Error const& failure) {
        EXPECT_EQ(std::string(failure.what()), (m_folder / "pipe").string() + " is a pipe, no plain file");
    }
    DialogueFile file(m_path);
    EXPECT_TRUE(testsupport::isHeldOpen(m_path.string()));
    obdsim::Dialogue dialogue;
    dialogue.exchanges.push_back({"ATI", {{obdsim::Time(0), std::string(100, 'x') + ">"}}});
    {
        testsupport::FileLimit const limit(20);
        EXPECT_THROW(file.save(dialogue), Error) << "a full disk";
    }
    EXPECT_FALSE(testsupport::isHeldOpen(m_path.string()));
    EXPECT_TRUE(std::filesystem::exists(m_path)) << "what is there is cut off, and said to be";
}

TEST_F(DialogueFileTest, tellsAFolderThatIsNotThere)
{
    EXPECT_THROW(DialogueFile(m_folder / "nowhere" / "car.dialogue"), Error);
}

} // namespace
