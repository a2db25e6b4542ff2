#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/readingoutput.h>

#include <gtest/gtest.h>

namespace {

using testsupport::TemporaryFolder;
using velmora::Error;
using velmora::Reading;
using velmora::ReadingOutput;

Reading rpmOfNow()
{
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.vehicle = "unnamed";
    reading.module = 0x7E8;
    reading.sensor = "RPM";
    reading.value = 1726.0;
    return reading;
}

TEST(ReadingOutput, WritesUnderTheVehiclesName)
{
    TemporaryFolder const folder;
    {
        ReadingOutput named("ndjson:" + folder.file("named"), "van");
        ReadingOutput plain("ndjson:" + folder.file("plain"), "");
        named.write(rpmOfNow());
        plain.write(rpmOfNow());
        EXPECT_EQ(named.counts().accepted, 1U);
        EXPECT_EQ(named.trouble(), "");
    }
    EXPECT_NE(folder.read("named").find("\"vehicle\":\"van\""), std::string::npos) << folder.read("named");
    EXPECT_NE(folder.read("plain").find("\"vehicle\":\"unnamed\""), std::string::npos) << folder.read("plain");
}

TEST(ReadingOutput, AFileMayHaveAnyName)
{
    TemporaryFolder const folder;
    for (std::string const name : {"a?rotate=day", "-", "udp:"}) {
        ReadingOutput("ndjson", folder.file(name), "van").write(rpmOfNow());
        EXPECT_NE(folder.read(name).find("\"vehicle\":\"van\""), std::string::npos) << name;
    }
    EXPECT_THROW(ReadingOutput("mqtt", folder.file("topic"), "van"), Error);
    EXPECT_THROW(ReadingOutput("pigeon", folder.file("coop"), "van"), Error);
}

TEST(ReadingOutput, TellsWhatIsWrong)
{
    EXPECT_NE(ReadingOutput("ndjson:/nowhere/at/all", "van").trouble(), "");
    EXPECT_THROW(ReadingOutput("pigeon:coop", "van"), Error);
    EXPECT_THROW(ReadingOutput("dash:127.0.0.1:0", "van"), Error) << "a page needs a car that it can ask";
}

} // namespace
