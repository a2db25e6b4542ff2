// The library's use by several at once: who opens it, whose log it writes, and when it ends.
#include "libvelmora/session/libraryuse.h"
#include "tests/support/temporaryfolder.h"

#include <common/logrecord.h>
#include <obd/troublecodecatalogue.h>
#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using testsupport::TemporaryFolder;
using velmora::LibraryUse;

bool isFilled()
{
    return !obd::TroubleCodeCatalogue::getRows().empty();
}

TEST(LibraryUse, LastsAsLongAsAnybodyUsesIt)
{
    EXPECT_FALSE(isFilled());
    {
        LibraryUse const first{""};
        auto second = std::make_unique<LibraryUse>("");
        second.reset();
        EXPECT_TRUE(isFilled());
    }
    EXPECT_FALSE(isFilled());
    EXPECT_EQ(tervex::LogSink.load(), nullptr);
}

TEST(LibraryUse, WritesTheLogOfWhomeverAskedForOne)
{
    TemporaryFolder const folder;
    {
        LibraryUse const first{""};
        {
            LibraryUse const second(folder.file("log"));
            LibraryUse const third{""};
            TERVEX_LOG(Info) << "of all";
        }
        EXPECT_NE(folder.read("log").find("of all"), std::string::npos) << "though it was open already";
        EXPECT_THROW(LibraryUse(folder.file("nowhere/log")), velmora::Error);
        EXPECT_TRUE(isFilled());
    }
    EXPECT_FALSE(isFilled()) << "who could not have a log is no user";
}

} // namespace
