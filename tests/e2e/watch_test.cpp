#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <chrono>
#include <cstdlib>
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

// A unit that names a program which is not installed is told as wrong, so it is judged with one that is.
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
    EXPECT_EQ(std::system(("systemd-analyze verify " + unit + " >" + log + " 2>&1").c_str()), 0);
    EXPECT_EQ(folder.read("log"), "");
    EXPECT_EQ(
        std::system(("systemd-analyze security --offline=true --threshold=25 " + unit + " >" + log + " 2>&1").c_str()),
        0)
        << folder.read("log");
}

// How it ends in an unkind moment; the script tells what the cases are. Under ThreadSanitizer alone it grants more
// time.
void expectEnding(std::string const& name)
{
#ifdef __SANITIZE_THREAD__
    std::string const slack = " 3";
#else
    std::string const slack = " 1";
#endif
    std::string const script = VELMORA_SOURCE_DIR "/tests/e2e/ending.py";
    EXPECT_EQ(std::system(("/usr/bin/python3 " + script + " " VELMORA_PROGRAM " " + name + slack).c_str()), 0);
}

TEST(Watch, EndsInTimeWhileTheNameOfABrokerIsLookedUp)
{
    expectEnding("name");
}

TEST(Watch, EndsInTimeWhileNobodyReadsAnOutput)
{
    expectEnding("pipe");
}

TEST(Watch, EndsInTimeWhileAnAdapterIsCalledThatDoesNotAnswer)
{
    expectEnding("adapter");
}

TEST(Watch, ASecondSignalEndsItAtOnce)
{
    expectEnding("twice");
}

} // namespace
