#include "libvelmora/watch/statefolder.h"
#include "libvelmora/watch/watchsettings.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <optional>
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

class ServiceFolder : public testing::Test
{
protected:
    ServiceFolder()
    {
        if (char const* const before = std::getenv(name)) {
            m_before = before;
        }
    }
    ~ServiceFolder() override { m_before ? ::setenv(name, m_before->c_str(), 1) : ::unsetenv(name); }

    static constexpr char const* name = "STATE_DIRECTORY";

    std::optional<std::string> m_before;
};

TEST_F(ServiceFolder, IsTheFirstThatTheSystemNames)
{
    TemporaryFolder const folder;
    ::setenv(name, (folder.file("own") + ":" + folder.file("other")).c_str(), 1);
    EXPECT_TRUE(velmora::runsAsService());
    EXPECT_EQ(velmora::stateFolder(), folder.file("own"));
    EXPECT_TRUE(std::filesystem::is_directory(folder.file("own")));
    EXPECT_FALSE(std::filesystem::exists(folder.file("other")));
    ::setenv(name, "", 1);
    EXPECT_FALSE(velmora::runsAsService());
    ::unsetenv(name);
    EXPECT_FALSE(velmora::runsAsService());
}

} // namespace
