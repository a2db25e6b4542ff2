#include "libvelmora/watch/statefolder.h"
#include "libvelmora/watch/watchsettings.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace {

using testsupport::TemporaryFolder;
using velmora::VehicleNames;

TEST(VehicleNames, AreMadeUpOnceForEachVehicle)
{
    TemporaryFolder const folder;
    VehicleNames names(folder.path());
    std::string const first = names.last();
    EXPECT_TRUE(velmora::isVehicleName(first));
    EXPECT_EQ(names.last(), first);
    EXPECT_EQ(names.of("VIN-1"), first); // that of the time before any vehicle was known
    std::string const second = names.of("VIN-2");
    EXPECT_NE(second, first);
    EXPECT_EQ(names.last(), second);
    EXPECT_EQ(VehicleNames(folder.path()).of("VIN-1"), first);
    EXPECT_EQ(names.last(), first);
    EXPECT_EQ(names.of("VIN-2"), second);
    EXPECT_EQ(folder.read("vehicles"), "VIN-1 " + first + "\nVIN-2 " + second + "\n");
    struct stat rights
    {};
    ASSERT_EQ(::stat(folder.file("vehicles").c_str(), &rights), 0);
    EXPECT_EQ(rights.st_mode & 0777U, 0600U);
    EXPECT_THROW(VehicleNames("/proc/nowhere").last(), velmora::Error);
}

} // namespace
