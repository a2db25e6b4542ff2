// Where standard input was closed before the program began, 0 is a descriptor as any other.
#include "libvelmora/output/ballast.h"
#include "libvelmora/output/database/database.h"
#include "libvelmora/output/influxoutput.h"
#include "libvelmora/output/linefile.h"
#include "libvelmora/port/doorbell.h"
#include "libvelmora/port/serialprobe.h"
#include "libvelmora/record/checkedfile.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/watch/servicenotify.h"
#include "libvelmora/watch/statefolder.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/libvelmora/watch/servicemanager.h"
#include "tests/support/closedinput.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using testsupport::ClosedInput;

TEST(ClosedInput, KeepsNoFileFromBeingWritten)
{
    testsupport::TemporaryFolder const folder;
    velmora::SettingsStore store(folder.file("settings.toml"));
    velmora::VehicleNames names(folder.path());
    ClosedInput const closed;
    velmora::requireWritable(folder.file("log"), "log file");
    store.setInt("common/unitsystem", 1);
    store.sync();
    EXPECT_EQ(folder.read("settings.toml"), "[common]\nunitsystem = 1\n");
    std::string const name = names.last();
    EXPECT_EQ(folder.read("vehicle-name"), name + "\n");
    EXPECT_TRUE(ClosedInput::isFree()) << "each was closed again";
}

TEST(ClosedInput, KeepsNoOutputFromItsFile)
{
    testsupport::TemporaryFolder const folder;
    velmora::LineFile lines(velmora::parseOutputAddress("csv:" + folder.file("lines")));
    ClosedInput const closed;
    lines.setHeader("head\n");
    lines.add("1\n", velmora::fromMillis(testsupport::march));
    lines.add("2\n", velmora::fromMillis(testsupport::march));
    EXPECT_EQ(folder.read("lines"), "head\n1\n2\n");
    lines.close();
    EXPECT_TRUE(ClosedInput::isFree()) << "it was opened once, and closed";
    EXPECT_TRUE(velmora::Ballast(folder.file("database"), 4096).keep());
    EXPECT_TRUE(ClosedInput::isFree());
    auto const influx = velmora::makeInfluxOutput(velmora::parseOutputAddress("influx:udp://127.0.0.1:9"));
    EXPECT_NO_THROW(influx->open());
    influx->close();
    EXPECT_TRUE(ClosedInput::isFree());
    EXPECT_NO_THROW(velmora::Database(folder.file("database"))); // SQLite itself leaves something in that place
}

TEST(ClosedInput, KeepsNobodyFromBeingTold)
{
    testsupport::TemporaryFolder const folder;
    velmora::test::Manager const manager(folder.file("notify"));
    velmora::ServiceNotify const notify;
    ClosedInput const closed;
    notify.tell("READY=1");
    EXPECT_EQ(manager.heard(), "READY=1");
    EXPECT_TRUE(ClosedInput::isFree());
    EXPECT_NO_THROW(velmora::Doorbell());
    EXPECT_TRUE(ClosedInput::isFree());
}

TEST(ClosedInput, KeepsNoSerialPortFromBeingProbed)
{
    velmora::test::ScriptedDevice const device("ELM327 v1.5\r\r>", B38400);
    ClosedInput const closed;
    velmora::SerialProbe const probe = velmora::probeSerialPort(device.path(), {38400});
    EXPECT_EQ(probe.outcome, velmora::SerialProbe::Outcome::Adapter);
    EXPECT_EQ(probe.text, "ELM327 v1.5");
    EXPECT_TRUE(ClosedInput::isFree());
}

} // namespace
