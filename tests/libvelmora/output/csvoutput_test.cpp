#include "libvelmora/output/csvoutput.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace {

using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::CsvOutput;
using velmora::parseOutputAddress;

std::vector<velmora::SharedRecord> speedAndRpm()
{
    return records(velmora::SensorList{
        {}, "van", {{0x7E8, "RPM", "010C", "Engine speed", "rpm"}, {0x7E8, "SPEED", "010D", "Speed", "km/h"}}});
}

std::string const header = "time,7E8 RPM (rpm),7E8 SPEED (km/h)\n";

void writeOnce(std::string const& address, std::vector<velmora::SharedRecord> const& values)
{
    CsvOutput output(parseOutputAddress(address));
    output.open();
    output.write(speedAndRpm());
    output.write(values);
    output.close();
}

TEST(CsvOutput, ARowIsARoundOfAllSensors)
{
    TemporaryFolder const folder;
    writeOnce("csv:" + folder.file("a.csv"),
              records(reading("RPM", 800.0), reading("SPEED", 0.0, march + 30), reading("RPM", 801.5, march + 60),
                      reading("SPEED", {}, march + 90), reading("RPM", 802.0, march + 2000)));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,800,0\n"
                                             "2026-03-01T08:15:00.310Z,801.5,-\n"
                                             "2026-03-01T08:15:02.250Z,802,\n");
    struct stat facts = {};
    ASSERT_EQ(::stat(folder.file("a.csv").c_str(), &facts), 0);
    EXPECT_EQ(facts.st_mode & 0777U, 0600U);
}

TEST(CsvOutput, GoesOnInAFileOfTheSameColumns)
{
    TemporaryFolder const folder;
    writeOnce("csv:" + folder.file("a.csv"), records(reading("RPM", 1.0)));
    writeOnce("csv:" + folder.file("a.csv"), records(reading("RPM", 2.0)));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,\n2026-03-01T08:15:00.250Z,2,\n");
}

TEST(CsvOutput, LeavesAFileOfOtherColumnsAlone)
{
    TemporaryFolder const folder;
    std::ofstream(folder.file("a.csv")) << "time,other\n1,2\n";
    writeOnce("csv:" + folder.file("a.csv"), records(reading("RPM", 1.0)));
    EXPECT_EQ(folder.read("a.csv"), "time,other\n1,2\n");
    EXPECT_EQ(folder.read("a-2.csv"), header + "2026-03-01T08:15:00.250Z,1,\n");
}

TEST(CsvOutput, ANewSensorBeginsAFileOfItsOwn)
{
    TemporaryFolder const folder;
    writeOnce("csv:" + folder.file("a.csv"), records(reading("RPM", 1.0), reading("LOAD", 5.0, march + 10)));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,\n");
    EXPECT_EQ(folder.read("a-2.csv"),
              "time,7E8 RPM (rpm),7E8 SPEED (km/h),7E8 LOAD (rpm)\n2026-03-01T08:15:00.260Z,,,5\n");
}

TEST(CsvOutput, CutsALineThatACrashLeftUnfinished)
{
    TemporaryFolder const folder;
    std::ofstream(folder.file("a.csv")) << header << "2026-03-01T08:14:00.000Z,7,8\n2026-03-01T08:1";
    writeOnce("csv:" + folder.file("a.csv"), records(reading("RPM", 1.0)));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:14:00.000Z,7,8\n2026-03-01T08:15:00.250Z,1,\n");
}

TEST(CsvOutput, StartsANewFileBySizeAndByDay)
{
    TemporaryFolder const bySize;
    CsvOutput sized(parseOutputAddress("csv:" + bySize.file("a.csv") + "?rotate=80"));
    sized.write(speedAndRpm());
    sized.write(records(reading("RPM", 1.0), reading("RPM", 2.0, march + 1)));
    sized.write(records(reading("RPM", 3.0, march + 2)));
    sized.close();
    EXPECT_EQ(bySize.read("a-20260301T081500Z.csv"), header + "2026-03-01T08:15:00.250Z,1,\n");
    EXPECT_EQ(bySize.read("a-20260301T081500Z-2.csv"), header + "2026-03-01T08:15:00.251Z,2,\n");
    EXPECT_EQ(bySize.read("a.csv"), header + "2026-03-01T08:15:00.252Z,3,\n");

    TemporaryFolder const byDay;
    CsvOutput daily(parseOutputAddress("csv:" + byDay.file("a.csv") + "?rotate=day"));
    daily.write(speedAndRpm());
    daily.write(records(reading("RPM", 1.0), reading("SPEED", 2.0), reading("RPM", 2.0, march + 1)));
    daily.write(records(reading("RPM", 3.0, march + 86400000)));
    daily.close();
    EXPECT_EQ(byDay.read("a-20260302T081500Z.csv"), header + "2026-03-01T08:15:00.250Z,1,2\n");
    EXPECT_EQ(byDay.read("a.csv"), header + "2026-03-01T08:15:00.251Z,2,\n2026-03-02T08:15:00.250Z,3,\n");
}

TEST(CsvOutput, AFullDiskLosesNoRowAndRepeatsNone)
{
    CsvOutput output(parseOutputAddress("csv:/dev/full"));
    output.write(speedAndRpm());
    EXPECT_THROW(output.write(records(reading("RPM", 1.0), reading("RPM", 2.0))), velmora::Error);

    TemporaryFolder const folder;
    std::filesystem::create_directory(folder.file("a.csv"));
    CsvOutput late(parseOutputAddress("csv:" + folder.file("a.csv")));
    late.write(speedAndRpm());
    auto const batch = records(reading("RPM", 1.0), reading("RPM", 2.0, march + 1));
    EXPECT_THROW(late.write(batch), velmora::Error);
    std::filesystem::remove(folder.file("a.csv"));
    late.write(batch);
    late.close();
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,\n2026-03-01T08:15:00.251Z,2,\n");
}

TEST(CsvOutput, ARowLastsASecond)
{
    TemporaryFolder const folder;
    writeOnce("csv:" + folder.file("a.csv"),
              records(reading("RPM", 1.0), reading("SPEED", 2.0, march + 999), reading("RPM", 3.0, march + 2000),
                      reading("SPEED", 4.0, march + 3000), reading("RPM", 5.0, march + 3000),
                      reading("RPM", 6.0, march + 4000), reading("SPEED", 7.0, march + 3999)));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,2\n"
                                             "2026-03-01T08:15:02.250Z,3,\n"
                                             "2026-03-01T08:15:03.250Z,5,4\n"
                                             "2026-03-01T08:15:04.250Z,6,\n"
                                             "2026-03-01T08:15:04.249Z,,7\n")
        << "a clock that goes back begins a row, too";
}

TEST(CsvOutput, ARowEndsWhenNothingComesOrOtherSensorsDo)
{
    TemporaryFolder const folder;
    CsvOutput output(parseOutputAddress("csv:" + folder.file("a.csv")));
    output.write(speedAndRpm());
    output.write(records(reading("RPM", 1.0), velmora::LampState{}));
    EXPECT_EQ(folder.read("a.csv"), "");
    output.write({});
    output.write({});
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,\n");
    output.write(records(reading("RPM", 2.0)));
    output.write(records(velmora::SensorList{{}, "van", {{0x7E9, "STATE", "0103", "State", ""}}}));
    EXPECT_EQ(folder.read("a.csv"), header + "2026-03-01T08:15:00.250Z,1,\n2026-03-01T08:15:00.250Z,2,\n");
    velmora::Reading text = reading("STATE", std::string("say \"a\", b"));
    text.module = 0x7E9;
    output.write(records(text));
    EXPECT_TRUE(testsupport::isHeldOpen(folder.file("a.csv")));
    output.close();
    EXPECT_FALSE(testsupport::isHeldOpen(folder.file("a-2.csv")));
    EXPECT_EQ(folder.read("a-2.csv"), "time,7E9 STATE\n2026-03-01T08:15:00.250Z,\"say \"\"a\"\", b\"\n");
}

TEST(CsvOutput, WhatCouldNotBeWrittenIsNotWrittenAtTheEndEither)
{
    TemporaryFolder const folder;
    std::filesystem::create_directory(folder.file("a.csv"));
    CsvOutput output(parseOutputAddress("csv:" + folder.file("a.csv")));
    output.write(speedAndRpm());
    EXPECT_THROW(output.write(records(reading("RPM", 1.0), reading("RPM", 2.0, march + 1))), velmora::Error);
    std::filesystem::remove(folder.file("a.csv"));
    output.close();
    EXPECT_FALSE(std::filesystem::exists(folder.file("a.csv"))) << "that was counted as lost already";
}

TEST(CsvLongOutput, BeginsAnotherDayByItsLines)
{
    TemporaryFolder const folder;
    velmora::CsvLongOutput output(parseOutputAddress("csv-long:" + folder.file("a.csv") + "?rotate=day"));
    output.open();
    output.write(records(reading("RPM", 1.0), velmora::LampState{}));
    output.write(records(reading("RPM", 2.0, march + 86400000), velmora::LampState{}));
    EXPECT_TRUE(testsupport::isHeldOpen(folder.file("a.csv")));
    output.close();
    EXPECT_FALSE(testsupport::isHeldOpen(folder.file("a.csv")));
    std::string const head = "time,vehicle,module,pid,sensor,name,value,unit\n";
    EXPECT_EQ(folder.read("a-20260302T081500Z.csv"),
              head + "2026-03-01T08:15:00.250Z,van,7E8,010C,RPM,Name of RPM,1,rpm\n");
    EXPECT_EQ(folder.read("a.csv"), head + "2026-03-02T08:15:00.250Z,van,7E8,010C,RPM,Name of RPM,2,rpm\n");
}

TEST(CsvLongOutput, HasALineAReading)
{
    TemporaryFolder const folder;
    velmora::CsvLongOutput output(parseOutputAddress("csv-long:" + folder.file("a.csv")));
    output.open();
    output.write(records(reading("RPM", 800.0), reading("STATE", std::string("a, b")), reading("SPEED", {})));
    output.close();
    EXPECT_EQ(folder.read("a.csv"), "time,vehicle,module,pid,sensor,name,value,unit\n"
                                    "2026-03-01T08:15:00.250Z,van,7E8,010C,RPM,Name of RPM,800,rpm\n"
                                    "2026-03-01T08:15:00.250Z,van,7E8,010C,STATE,Name of STATE,\"a, b\",rpm\n"
                                    "2026-03-01T08:15:00.250Z,van,7E8,010C,SPEED,Name of SPEED,-,rpm\n");
}

} // namespace
