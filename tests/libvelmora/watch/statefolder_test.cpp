#include "libvelmora/watch/statefolder.h"
#include "libvelmora/watch/watchsettings.h"
#include "tests/support/filelimit.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
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

std::string namesTrouble(VehicleNames& names, std::string const& vin)
{
    try {
        names.of(vin);
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Failed);
        return error.what();
    }
    return "";
}

TEST(VehicleNames, MakeUpForWhatIsNoNameInTheirFiles)
{
    TemporaryFolder const folder;
    std::ofstream(folder.file("vehicle-name")) << "my van\n";
    VehicleNames names(folder.path());
    std::string const first = names.last();
    EXPECT_TRUE(first.starts_with("car-") && first.size() == 12) << first;
    EXPECT_EQ(folder.read("vehicle-name"), first + "\n");
    std::ofstream(folder.file("vehicle-name")) << "van\n";
    std::ofstream(folder.file("vehicles")) << "VIN-1 my/van\nVIN-2 bus\n";
    EXPECT_EQ(names.of("VIN-1"), "van") << "which is nobody's";
    EXPECT_EQ(names.of("VIN-2"), "bus");
    EXPECT_EQ(folder.read("vehicle-name"), "bus\n");
    std::string const third = names.of("VIN-3");
    EXPECT_NE(third, "bus");
    EXPECT_EQ(folder.read("vehicle-name"), third + "\n");
    EXPECT_EQ(names.of("VIN-3"), third);
    EXPECT_FALSE(std::filesystem::exists(folder.file("vehicles.new")));
}

TEST(VehicleNames, StayAsTheyWereOnAFullDisk)
{
    TemporaryFolder const folder;
    VehicleNames names(folder.path());
    EXPECT_EQ(namesTrouble(names, "VIN-1"), "");
    std::string const before = folder.read("vehicles");
    long const open = testsupport::openDescriptors();
    {
        testsupport::FileLimit const limit(25);
        EXPECT_EQ(namesTrouble(names, "VIN-2"), "Could not write " + folder.file("vehicles"));
    }
    EXPECT_EQ(folder.read("vehicles"), before);
    EXPECT_EQ(testsupport::openDescriptors(), open);
    std::filesystem::remove(folder.file("vehicles"));
    std::filesystem::create_directories(folder.file("vehicles/in the way"));
    EXPECT_EQ(namesTrouble(names, "VIN-3"), "Could not write " + folder.file("vehicles"));
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

TEST_F(ServiceFolder, OrIsTheUsers)
{
    TemporaryFolder const folder;
    std::string const home = std::getenv("HOME") != nullptr ? std::getenv("HOME") : "";
    ::unsetenv(name);
    ::setenv("XDG_STATE_HOME", folder.file("state").c_str(), 1);
    EXPECT_EQ(velmora::stateFolder(), folder.file("state/velmora"));
    ::unsetenv("XDG_STATE_HOME");
    ::setenv("HOME", folder.path().c_str(), 1);
    EXPECT_EQ(velmora::stateFolder(), folder.file(".local/state/velmora"));
    EXPECT_TRUE(std::filesystem::is_directory(folder.file(".local/state/velmora")));
    ::setenv(name, "/proc/none", 1);
    try {
        velmora::stateFolder();
        ADD_FAILURE() << "no folder can be made there";
    } catch (velmora::Error const& error) {
        EXPECT_EQ(std::string(error.what()), "Could not make the folder /proc/none: No such file or directory");
    }
    home.empty() ? ::unsetenv("HOME") : ::setenv("HOME", home.c_str(), 1);
}

} // namespace
