#include "libvelmora/session/foundport.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

std::string tryingText(std::string const& device, unsigned int baud)
{
    return fmt::format("Trying {} at {} baud ...\n", device, baud);
}

TEST(FoundPort, IsRememberedAndTriedFirstTheNextTime)
{
    test::ScriptedDevice const console("switch>", B0);
    test::ScriptedDevice const adapter("ELM327 v1.5\r\r>", B115200);
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const settings = folder.path() / "settings.toml";
    std::ofstream(settings) << "[common]\nunitsystem = 1\n[velmora]\nfoundport = \"serial:///dev/velmora-none\"\n";
    std::string told;
    PortSearch search;
    search.ports = {{console.path(), ""}, {adapter.path(), ""}};
    search.baud = 115200;
    search.tell = [&told](std::string const& line) { told += line; };
    PortAddress const address{SerialAddress{adapter.path(), 115200}};
    EXPECT_EQ(findAdapterAgain(search, settings), address);
    EXPECT_EQ(told, tryingText(console.path(), 115200) + tryingText(adapter.path(), 115200));

    told.clear();
    search.baud.reset();
    std::filesystem::last_write_time(settings, std::filesystem::file_time_type());
    EXPECT_EQ(findAdapterAgain(search, settings), address);
    EXPECT_EQ(std::filesystem::last_write_time(settings), std::filesystem::file_time_type()) << "it is known already";
    EXPECT_EQ(told, tryingText(adapter.path(), 115200)) << "at its rate, and nobody else is asked";
    EXPECT_EQ(console.received(), "ATI\r");
    std::ifstream in(settings);
    std::string const kept{std::istreambuf_iterator<char>(in), {}};
    EXPECT_NE(kept.find("unitsystem = 1"), std::string::npos) << kept;
    EXPECT_NE(kept.find(adapter.path()), std::string::npos) << kept;

    search.ports = {{console.path(), ""}};
    EXPECT_THROW(findAdapterAgain(search, settings), Error) << "it is plugged in no more";
}

TEST(FoundPort, WhatIsNoPortIsToldAndReplaced)
{
    test::ScriptedDevice const adapter("ELM327 v1.5\r\r>", B38400);
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const settings = folder.path() / "settings.toml";
    std::ofstream(settings) << "[velmora]\nfoundport = \"nonsense here\"\n";
    std::string told;
    PortSearch search;
    search.ports = {{adapter.path(), ""}};
    search.tell = [&told](std::string const& line) { told += line; };
    EXPECT_EQ(findAdapterAgain(search, settings), PortAddress(SerialAddress{adapter.path(), 38400}));
    EXPECT_NE(told.find("settings.toml is left out: "), std::string::npos) << told;
    EXPECT_NE(told.find("nonsense here"), std::string::npos) << told;
    told.clear();
    EXPECT_EQ(findAdapterAgain(search, settings), PortAddress(SerialAddress{adapter.path(), 38400}));
    EXPECT_EQ(told, tryingText(adapter.path(), 38400)) << "the new one is remembered in its place";
}

TEST(FoundPort, WhatCanNotBeRememberedIsToldAndUsed)
{
    test::ScriptedDevice const adapter("ELM327 v1.5\r\r>", B38400);
    std::string told;
    PortSearch search;
    search.ports = {{adapter.path(), ""}};
    search.tell = [&told](std::string const& line) { told += line; };
    PortAddress const address{SerialAddress{adapter.path(), 38400}};
    EXPECT_EQ(findAdapterAgain(search, "/proc/none/settings.toml"), address);
    EXPECT_NE(told.find("The port is not remembered: "), std::string::npos) << told;
}

} // namespace

} // namespace velmora
