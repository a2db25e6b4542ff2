#include "libobd/catalogue/dtcreader.h"
#include "tests/support/temporaryfolder.h"

#include <common/logrecord.h>
#include <obd/library.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <unistd.h>

namespace {

std::string content(std::filesystem::path const& path)
{
    std::ifstream in(path);
    return {std::istreambuf_iterator<char>(in), {}};
}

TEST(Library, OpenAndCloseAreLoggedAndLaterLinesAreDropped)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const log = folder.path() / "log";
    EXPECT_TRUE(obd::LIBOBDOpen(log));
    EXPECT_TRUE(content(log).ends_with(" INFO - Lib OBD init\n"));
    obd::LIBOBDClose();
    EXPECT_TRUE(content(log).ends_with(" INFO - Lib OBD cleanup done\n"));
    TERVEX_LOG(Info) << "after the end";
    EXPECT_EQ(content(log).find("after the end"), std::string::npos);
}

TEST(Library, OpenSucceedsWithoutALog)
{
    EXPECT_TRUE(obd::LIBOBDOpen(""));
    EXPECT_NO_THROW(TERVEX_LOG(Fatal) << "lost");
    obd::LIBOBDClose();
}

TEST(Library, OpenSucceedsThoughTheFolderDoesNotExist)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const missing = folder.path() / "no" / "log.txt";
    EXPECT_TRUE(obd::LIBOBDOpen(missing));
    EXPECT_FALSE(std::filesystem::exists(missing));
    obd::LIBOBDClose();
}

TEST(Library, TroubleCodeTextsAreThereFromOpenToClose)
{
    auto const meaning = [] { return obd::DtcReader().getTroubleCodes("P0420").front()->description; };
    EXPECT_EQ(meaning(), "ISO/SAE Reserved");
    obd::LIBOBDOpen("");
    EXPECT_EQ(meaning(), "Catalyst System Efficiency Below Threshold Bank 1");
    obd::LIBOBDClose();
    EXPECT_EQ(meaning(), "ISO/SAE Reserved");
}

TEST(Library, OpenedTwiceItHasEachTextOnce)
{
    auto const meanings = [] { return obd::DtcReader().getTroubleCodes("P0420").size(); };
    obd::LIBOBDOpen("");
    obd::LIBOBDOpen("");
    EXPECT_EQ(meanings(), 1U);
    obd::LIBOBDClose();
    obd::LIBOBDOpen("");
    EXPECT_EQ(meanings(), 1U);
    obd::LIBOBDClose();
    EXPECT_EQ(obd::DtcReader().getTroubleCodes("P0420").front()->description, "ISO/SAE Reserved");
}

tervex::ITraceLogger* sinkOfAWorker = nullptr;
testsupport::TemporaryFolder* lastFolder = nullptr; // none ends by itself behind _exit

// What was registered first runs last at an exit, behind the end of all that was made meanwhile.
[[noreturn]] void exitWhileAWorkerLogs()
{
    std::atexit([] {
        sinkOfAWorker->log("", 0, static_cast<int>(tervex::LogLevel::Info), "the last word");
        bool const told = content(lastFolder->path() / "log").ends_with("the last word\n");
        delete lastFolder;
        ::_exit(told ? 0 : 1);
    });
    lastFolder = new testsupport::TemporaryFolder;
    obd::LIBOBDOpen(lastFolder->path() / "log");
    sinkOfAWorker = tervex::LogSink; // as a record has it that is about to end
    std::exit(2);
}

TEST(LibraryDeathTest, TheLogTakesLinesUntilTheProcessHasEnded)
{
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_EXIT(exitWhileAWorkerLogs(), testing::ExitedWithCode(0), "");
}

} // namespace
