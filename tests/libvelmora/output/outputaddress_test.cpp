#include "libvelmora/output/opening/outputfactory.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/valuetext.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <sys/stat.h>

namespace {

using testing::HasSubstr;
using velmora::OutputAddress;
using velmora::parseOutputAddress;
using velmora::parseSize;

std::string outputComplaint(std::string const& text)
{
    try {
        velmora::makeOutput(parseOutputAddress(text), {});
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
        return error.what();
    }
    return "";
}

TEST(OutputAddress, HasKindTargetAndOptions)
{
    OutputAddress const address = parseOutputAddress("csv:/var/log/a:b.csv?rotate=day&queue=50");
    EXPECT_EQ(address.kind, "csv");
    EXPECT_EQ(address.target, "/var/log/a:b.csv");
    EXPECT_EQ(address.option("rotate"), "day");
    EXPECT_EQ(address.option("queue", "1"), "50");
    EXPECT_EQ(address.option("other", "1"), "1");
    EXPECT_EQ(toString(address), "csv:/var/log/a:b.csv");
}

TEST(OutputAddress, ABrokerIsAUrl)
{
    OutputAddress const address = parseOutputAddress("mqtts://broker:8883/cars/van?ca=/etc/ca.pem&qos=1");
    EXPECT_EQ(address.kind, "mqtts");
    EXPECT_EQ(address.target, "broker:8883/cars/van");
    EXPECT_EQ(address.option("ca"), "/etc/ca.pem");
    EXPECT_EQ(toString(address), "mqtts://broker:8883/cars/van");
}

TEST(OutputAddress, TellsWhatIsWrong)
{
    EXPECT_THAT(outputComplaint("drive.csv"), HasSubstr("known kind"));
    EXPECT_THAT(outputComplaint("tape:drive"), HasSubstr("known kind"));
    EXPECT_THAT(outputComplaint("csv:"), HasSubstr("where it goes is missing"));
    EXPECT_THAT(outputComplaint("csv:?rotate=day"), HasSubstr("where it goes is missing"));
    EXPECT_THAT(outputComplaint("mqtt:broker/topic"), HasSubstr("// is missing"));
    EXPECT_THAT(outputComplaint("csv:a?rotate"), HasSubstr("\"rotate\" is not key=value"));
    EXPECT_THAT(outputComplaint("csv:a?=day"), HasSubstr("not key=value"));
    EXPECT_THAT(outputComplaint("csv:a?qos=1"), HasSubstr("no setting \"qos\""));
    EXPECT_THAT(outputComplaint("csv:a?rotate=1k&rotate=day"), HasSubstr("twice"));
    EXPECT_THAT(outputComplaint("csv:a?rotate=often"), HasSubstr("\"often\" is no size"));
    EXPECT_THAT(outputComplaint("influx:udp://nowhere"), HasSubstr("needs a host and a port"));
}

TEST(OutputAddress, IsToldWithItsSettings)
{
    OutputAddress const address = parseOutputAddress("csv:a?rotate=&queue=5&");
    EXPECT_EQ(address.options.size(), 2U);
    EXPECT_EQ(address.option("rotate", "1"), "");
    EXPECT_EQ(parseOutputAddress("csv:a?").options.size(), 0U);
    EXPECT_EQ(velmora::toString({"tape", "x", {}}), "tape:x");
    for (auto const& [text, known] : {std::pair("csv:a?x=1", "it knows rotate, queue"),
                                      {"sqlite:a?x=1", "it knows ballast, queue"},
                                      {"prometheus:a?x=1", "it knows queue"},
                                      {"dash:a?x=1", "it knows allow_clear, allow_console, name, queue"},
                                      {"mqtts://a?x=1", "it knows qos, ca, user_file, password_file, ack_topic, spool, "
                                                        "spool_max, discovery, keep_alive, queue"}}) {
        try {
            parseOutputAddress(text);
            ADD_FAILURE() << text;
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.hints(), std::vector<std::string>{known});
        }
    }
}

// In a folder where names that mean something else are those of folders, too.
TEST(OutputFiles, AreNoHostsAndNoStandardOutput)
{
    testsupport::TemporaryFolder const folder;
    auto const before = std::filesystem::current_path();
    std::filesystem::current_path(folder.path());
    std::filesystem::create_directories("udp:/127.0.0.1:9");
    std::filesystem::create_directory("-");
    for (char const* const text : {"ndjson:-", "influx:udp://127.0.0.1:9", "prometheus:-", "mqtt://-"}) {
        EXPECT_NO_THROW(velmora::requirePlainTarget(parseOutputAddress(text))) << text;
    }
    EXPECT_THROW(velmora::requirePlainTarget(parseOutputAddress("csv:udp:")), velmora::Error);
    for (char const* const kind : {"", "dash", "mqtt", "prometheus", "tape"}) {
        EXPECT_THROW(velmora::fileOutput(kind, "a"), velmora::Error) << kind;
    }
    EXPECT_EQ(velmora::fileOutput("csv-long", "a").target, std::filesystem::current_path() / "a");
    std::filesystem::current_path(before);
}

TEST(OutputFiles, ArePlainOnes)
{
    testsupport::TemporaryFolder const folder;
    ASSERT_EQ(::mkfifo(folder.file("pipe").c_str(), 0600), 0);
    std::filesystem::create_directory(folder.file("inner"));
    for (std::string const kind : {"csv:", "csv-long:", "ndjson:", "influx:", "sqlite:"}) {
        for (auto const& [target, what] : {std::pair(folder.file("pipe"), " is a pipe, no plain file"),
                                           {folder.file("inner"), " is a folder, no plain file"},
                                           {std::string("/dev/null"), " is a device, no plain file"}}) {
            EXPECT_EQ(outputComplaint(kind + target), target + what) << kind;
        }
        EXPECT_EQ(outputComplaint(kind + folder.file("none")), "") << kind << " makes it";
    }
    EXPECT_EQ(outputComplaint("ndjson:-"), "");
    EXPECT_EQ(outputComplaint("influx:udp://127.0.0.1:8089"), "");
}

TEST(OutputAddress, SizesHaveBinaryUnits)
{
    EXPECT_EQ(parseSize("500"), 500U);
    EXPECT_EQ(parseSize("10k"), 10240U);
    EXPECT_EQ(parseSize("10MB"), 10485760U);
    EXPECT_EQ(parseSize("2G"), 2147483648U);
    for (char const* const ten : {"10", "10B", "10b"}) {
        EXPECT_EQ(parseSize(ten), 10U);
    }
    for (char const* const one : {"1048576k", "1024M", "1G", "1GB", "1gb", "1Gb", "1024mB", "1048576K"}) {
        EXPECT_EQ(parseSize(one), 1ULL << 30) << one;
    }
    EXPECT_EQ(parseSize("18446744073709551615"), ~0ULL);
    EXPECT_EQ(parseSize("17179869183G"), 17179869183ULL << 30);
    EXPECT_THROW(parseSize("17179869184G"), velmora::Error);
    for (char const* const wrong :
         {"", "0", "-1", "1T", "k", "1kk", "1BB", "1KBB", "1 k", "99999999999999999999", "99999999999999G"}) {
        EXPECT_THROW(parseSize(wrong), velmora::Error) << wrong;
    }
}

TEST(ValueText, TimesAndNumbers)
{
    EXPECT_EQ(velmora::utcTime(velmora::fromMillis(1772352900250)), "2026-03-01T08:15:00.250Z");
    EXPECT_EQ(velmora::utcTime(velmora::fromMillis(-1)), "1969-12-31T23:59:59.999Z");
    EXPECT_EQ(velmora::numberText(12.6), "12.6");
    EXPECT_EQ(velmora::numberText(0.1 + 0.2), "0.3");
    EXPECT_EQ(velmora::numberText(-0.0), "0");
    EXPECT_EQ(velmora::numberText(1234567.0), "1234567");
    EXPECT_EQ(velmora::moduleText(0x7E8), "7E8");
}

} // namespace
