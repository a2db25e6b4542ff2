// Where standard input was closed before the program began, 0 is a descriptor as any other.
#include "libvelmora/port/doorbell.h"
#include "libvelmora/port/serialprobe.h"
#include "libvelmora/record/checkedfile.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/watch/servicenotify.h"
#include "libvelmora/watch/statefolder.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/libvelmora/watch/servicemanager.h"
#include "tests/support/closedinput.h"
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
