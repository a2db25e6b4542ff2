#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

using e2e::ChildProcess;
using e2e::runVelmora;
using testing::HasSubstr;
using testing::StartsWith;
using testsupport::TemporaryFolder;

// Stands for the service manager: receives what the watch says of itself.
class NotifySocket
{
public:
    explicit NotifySocket(std::string const& path) : m_socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0))
    {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        path.copy(address.sun_path, sizeof(address.sun_path) - 1);
        EXPECT_EQ(::bind(m_socket, reinterpret_cast<sockaddr*>(&address), sizeof(address)), 0);
        timeval const limit{60, 0};
        ::setsockopt(m_socket, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof(limit));
        ::setenv("NOTIFY_SOCKET", path.c_str(), 1);
        ::setenv("WATCHDOG_USEC", "2000000", 1);
    }
    ~NotifySocket()
    {
        ::unsetenv("NOTIFY_SOCKET");
        ::unsetenv("WATCHDOG_USEC");
        ::close(m_socket);
    }
    NotifySocket(NotifySocket const&) = delete;
    NotifySocket& operator=(NotifySocket const&) = delete;

    bool waitFor(std::string const& state) const
    {
        for (char text[500]; true;) {
            ssize_t const count = ::recv(m_socket, text, sizeof(text), 0);
            if (count <= 0) {
                return false;
            }
            if (std::string(text, static_cast<std::size_t>(count)).starts_with(state)) {
                return true;
            }
        }
    }

private:
    int m_socket;
};

TEST(Watch, RunsAsAServiceWritesAndEndsWithinTwoSecondsWithAllOnTheDisk)
{
    TemporaryFolder const folder;
    ::setenv("STATE_DIRECTORY", folder.file("state").c_str(), 1);
    std::vector<std::string> lines;
    {
        NotifySocket const manager(folder.file("notify"));
        ChildProcess watch({"watch", "--port", "sim:petrol-can11?instant", "--output", "ndjson:-", "--output",
                            "sqlite:" + folder.file("a.db"), "--output", "csv:" + folder.file("a.csv")});
        EXPECT_TRUE(manager.waitFor("READY=1"));
        EXPECT_TRUE(manager.waitFor("STATUS=running"));
        EXPECT_TRUE(manager.waitFor("WATCHDOG=1"));
        for (bool speed = false; !speed;) {
            lines.push_back(watch.readLine());
            ASSERT_FALSE(lines.back().empty());
            speed = lines.back().find("\"SPEED\"") != std::string::npos;
        }
        auto const begin = std::chrono::steady_clock::now();
        watch.interrupt();
        EXPECT_EQ(watch.wait(), 0);
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2));
        EXPECT_TRUE(manager.waitFor("STOPPING=1"));
    }
    ::unsetenv("STATE_DIRECTORY");
    nlohmann::json const reading = nlohmann::json::parse(lines.back());
    EXPECT_THAT(reading["vehicle"], StartsWith("car-")); // made up and kept
    EXPECT_EQ(folder.read("state/vehicle-name"), reading["vehicle"].get<std::string>() + "\n");
    EXPECT_EQ(reading["unit"], "km/h");
    EXPECT_THAT(folder.read("a.csv"), StartsWith("time,7E8 RPM (rpm),7E8 SPEED (km/h),"));
    EXPECT_THAT(runVelmora({"trips", "--csv", folder.file("a.db")}).out, HasSubstr(",engine run,"));
    auto const trips = nlohmann::json::parse(runVelmora({"trips", "--json", folder.file("a.db")}).out);
    EXPECT_EQ(trips["trips"].size(), 1U);
    EXPECT_EQ(trips["trips"][0]["kind"], "engine run");
}

// What stands in all files of a folder, their names with it.
std::string everythingIn(TemporaryFolder const& folder)
{
    std::string all;
    for (auto const& each : std::filesystem::recursive_directory_iterator(folder.path())) {
        all += each.path().string() + "\n";
        if (each.is_regular_file()) {
            std::ifstream in(each.path(), std::ios::binary);
            all.append(std::istreambuf_iterator<char>(in), {});
        }
    }
    return all;
}

TEST(Watch, OutputsHoldTheVinOnlyIfToldTo)
{
    for (std::string const vin : {"none", "full"}) {
        TemporaryFolder const state; // where the names of vehicles are kept, by their numbers
        TemporaryFolder const folder;
        ::setenv("STATE_DIRECTORY", state.path().c_str(), 1);
        ChildProcess watch({"watch", "--port", "sim:petrol-can11?instant", "--vin", vin, "--output", "ndjson:-",
                            "--output", "sqlite:" + folder.file("a.db"), "--output", "csv:" + folder.file("a.csv"),
                            "--output", "csv-long:" + folder.file("b.csv"), "--output", "influx:" + folder.file("c"),
                            "--output", "mqtt://127.0.0.1:1/cars?spool=" + folder.file("spool")});
        std::string lines;
        for (int i = 0; i < 30; ++i) {
            lines += watch.readLine();
        }
        watch.interrupt();
        EXPECT_EQ(watch.wait(), 0);
        EXPECT_THAT(lines, HasSubstr("\"RPM\""));
        bool const found = (lines + everythingIn(folder)).find("VELMRAS1MM0000001") != std::string::npos;
        EXPECT_EQ(found, vin == "full");
        for (auto const& each : std::filesystem::recursive_directory_iterator(folder.path())) {
            EXPECT_EQ(each.status().permissions() & std::filesystem::perms::mask, std::filesystem::perms(0600))
                << each.path();
        }
        ::unsetenv("STATE_DIRECTORY");
    }
}

TEST(Watch, ReadsItsSettingsAgainAndKeepsThemIfTheNewOnesMakeNoSense)
{
    TemporaryFolder const folder;
    ::setenv("STATE_DIRECTORY", folder.file("state").c_str(), 1);
    std::string const file = folder.file("w.toml");
    std::string const port = "port = \"sim:petrol-can11?instant\"\n";
    std::ofstream(file) << port << "vehicle = \"first\"\n";
    ChildProcess watch({"watch", "--config", file, "--output", "ndjson:-", "--quiet"});
    auto const readUntil = [&watch](std::string const& part) {
        std::string line = watch.readLine();
        while (!line.empty() &&
               (line.find(part) == std::string::npos || line.find("\"sensor\"") == std::string::npos)) {
            line = watch.readLine();
        }
        return !line.empty();
    };
    EXPECT_TRUE(readUntil("\"first\""));
    std::ofstream(file) << port << "vehicle = \"second\"\n";
    watch.hangUp();
    EXPECT_TRUE(readUntil("\"second\""));
    std::ofstream(file) << port << "vehicle = \"not a name\"\n";
    watch.hangUp();
    std::string line = watch.readLine();
    while (!line.empty() && line.find("\"engine_start\"") == std::string::npos) { // it has begun anew
        line = watch.readLine();
    }
    EXPECT_THAT(line, HasSubstr("\"second\""));
    watch.interrupt();
    EXPECT_EQ(watch.wait(), 0);
    ::unsetenv("STATE_DIRECTORY");
}

// Reads from a vehicle until it is known by which name, and tells that.
std::string nameOf(std::string const& vehicle)
{
    ChildProcess watch({"watch", "--port", "sim:" + vehicle + "?instant", "--output", "ndjson:-", "--quiet"});
    std::string name;
    for (std::string line = watch.readLine(); name.empty() && !line.empty(); line = watch.readLine()) {
        if (line.find("\"sensor\"") != std::string::npos) {
            name = nlohmann::json::parse(line)["vehicle"];
        }
    }
    watch.interrupt();
    EXPECT_EQ(watch.wait(), 0);
    return name;
}

TEST(Watch, AnAdapterThatMovesToAnotherCarTakesAnotherName)
{
    TemporaryFolder const folder;
    ::setenv("STATE_DIRECTORY", folder.file("state").c_str(), 1);
    std::string const first = nameOf("petrol-can11");
    std::string const second = nameOf("diesel-can29");
    EXPECT_THAT(first, StartsWith("car-"));
    EXPECT_THAT(second, StartsWith("car-"));
    EXPECT_NE(first, second);
    EXPECT_EQ(nameOf("petrol-can11"), first);
    ::unsetenv("STATE_DIRECTORY");
}

TEST(Watch, TellsMistakesInItsSettings)
{
    TemporaryFolder const folder;
    std::ofstream(folder.file("w.toml")) << "port = \"sim:petrol-can11\"\nvehicle = \"my van\"\n";
    e2e::Outcome const wrong = runVelmora({"watch", "--config", folder.file("w.toml"), "--check-config"});
    EXPECT_EQ(wrong.exitCode, 2);
    EXPECT_THAT(wrong.err, HasSubstr("w.toml:2: vehicle: must be a name"));
    std::string const example = VELMORA_SOURCE_DIR "/packaging/watch.toml";
    EXPECT_EQ(runVelmora({"watch", "--config", example, "--check-config"}).exitCode, 0);
    EXPECT_EQ(runVelmora({"watch", "--output", "csv:a"}).exitCode, 2);
    EXPECT_EQ(runVelmora({"trips", folder.file("none")}).exitCode, 2);
    EXPECT_EQ(runVelmora({"trips", folder.file("w.toml")}).exitCode, 2);
}

// A unit that names a program which is not installed is told as wrong, so it is judged with one that is. Its manual
// pages need not be.
TEST(Watch, TheServiceManagerFindsNothingToSayAgainstTheUnit)
{
    TemporaryFolder const folder;
    std::ifstream in(VELMORA_SOURCE_DIR "/packaging/velmora-watch.service");
    std::ofstream out(folder.file("velmora-watch.service"));
    for (std::string line; std::getline(in, line);) {
        std::size_t const program = line.find("/usr/bin/velmora");
        out << (program == std::string::npos ? line : line.replace(program, 16, VELMORA_PROGRAM)) << "\n";
    }
    out.close();
    std::string const unit = folder.file("velmora-watch.service");
    std::string const log = folder.file("log");
    EXPECT_EQ(std::system(("systemd-analyze verify --man=no " + unit + " >" + log + " 2>&1").c_str()), 0);
    EXPECT_EQ(folder.read("log"), "");
    EXPECT_EQ(
        std::system(("systemd-analyze security --offline=true --threshold=25 " + unit + " >" + log + " 2>&1").c_str()),
        0)
        << folder.read("log");
}

} // namespace
