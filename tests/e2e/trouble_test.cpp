// What goes wrong in mid-session, files that have no end, and the terminal, in real time.

#include "tests/e2e/childprocess.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <chrono>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <memory>
#include <netinet/in.h>
#include <string>
#include <sys/socket.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>
#include <utility>

namespace {

using e2e::ChildProcess;
using e2e::Outcome;
using e2e::runOnTerminal;
using e2e::runVelmora;

bool contains(std::string const& text, std::string const& part)
{
    return text.find(part) != std::string::npos;
}

// A simulated car on a port of its own, with faults.
class FaultyCar
{
public:
    explicit FaultyCar(std::vector<std::string> const& faults, std::string const& vehicle = "petrol-can11")
    {
        std::vector<std::string> arguments = {"simulate", "--listen", "tcp://127.0.0.1:0", "--vehicle", vehicle};
        for (std::string const& fault : faults) {
            arguments.insert(arguments.end(), {"--fault", fault});
        }
        m_simulator = std::make_unique<ChildProcess>(arguments);
        m_port = m_simulator->readLine();
    }
    std::string const& port() const { return m_port; }

private:
    std::unique_ptr<ChildProcess> m_simulator;
    std::string m_port;
};

TEST(Trouble, AnAdapterThatFallsSilentIsExitCodeFourInEveryCommand)
{
    std::vector<std::vector<std::string>> const commands = {
        {"info"}, // while it is brought up
        {"scan"},
        {"codes"},
        {"info"},
        {"monitors"},
        {"clear"},
        {"live", "RPM", "--duration", "60"},
        {"log", "RPM", "--duration", "60"},
        {"modules"},
        {"codes", "--uds"},
        {"signals", "probe", "--service", "22", "--from", "F190", "--to", "F191", "--module", "7E0"}};
    auto const start = std::chrono::steady_clock::now();
    std::vector<FaultyCar> cars;
    std::vector<std::unique_ptr<ChildProcess>> running; // at once: each mostly waits
    for (std::vector<std::string> const& command : commands) {
        // The connection stands after 36 commands.
        bool const bringUp = running.empty();
        cars.emplace_back(std::vector<std::string>{bringUp                      ? "silent@8"
                                                   : command.front() == "clear" ? "silent@37"
                                                                                : "silent@38"});
        std::vector<std::string> arguments = {
            "-q", "-y", "-p", cars.back().port(), "--settings", testsupport::ownPath("silent.toml")};
        arguments.insert(arguments.end(), command.begin(), command.end());
        running.push_back(std::make_unique<ChildProcess>(arguments));
    }
    FaultyCar const bare({"silent@2"});
    Outcome const console = runVelmora({"-q", "-p", bare.port(), "console"}, "ATI\nATRV\n");
    EXPECT_EQ(console.exitCode, 4) << console.err;
    EXPECT_TRUE(contains(console.err, "no longer answers")) << console.err;
    for (std::size_t i = 0; i < commands.size(); ++i) {
        EXPECT_EQ(running[i]->wait(), 4) << commands[i].front();
    }
    // Nobody asks on for minutes.
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(30));
}

TEST(Trouble, AnAdapterThatResetsItselfIsSetUpAgainAndNamed)
{
    // One without a word is found behind the request that it fell into, which may have been the one for the VIN.
    for (auto const& [reset, lastsBehind] : {std::pair{"reset:ERR94@40", "VELMRAS1MM0000001"},
                                             {"reset:banner@40", "VELMRAS1MM0000001"},
                                             {"reset@40", "640 km"}}) {
        FaultyCar const car({reset});
        Outcome const outcome = runVelmora({"-p", car.port(), "info"});
        EXPECT_EQ(outcome.exitCode, 0) << reset << outcome.err;
        EXPECT_TRUE(contains(outcome.out, lastsBehind)) << reset << outcome.out;
        EXPECT_TRUE(contains(outcome.err, "reset itself 1x")) << reset << outcome.err;
    }
    FaultyCar const car({"reset:LV RESET@38", "reset:LV RESET@50"});
    Outcome const outcome = runVelmora({"-p", car.port(), "scan"});
    EXPECT_EQ(outcome.exitCode, 8) << outcome.err;
    EXPECT_TRUE(contains(outcome.err, "resets itself again and again")) << outcome.err;
    EXPECT_FALSE(contains(outcome.err, "ignition")) << outcome.err;
}

// An adapter that says who it is, and then the same without end.
class FloodingServer
{
public:
    explicit FloodingServer(std::string const& piece) : m_listening(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0))
    {
        for (int i = 0; i < 4096; ++i) {
            m_flood += piece;
        }
        sockaddr_in address = {};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t size = sizeof address;
        auto* const plain = reinterpret_cast<sockaddr*>(&address);
        EXPECT_EQ(::bind(m_listening, plain, size), 0);
        EXPECT_EQ(::listen(m_listening, 4), 0);
        EXPECT_EQ(::getsockname(m_listening, plain, &size), 0);
        m_port = "tcp://127.0.0.1:" + std::to_string(ntohs(address.sin_port));
        m_thread = std::thread([this] { serve(); });
    }
    ~FloodingServer()
    {
        ::shutdown(m_listening, SHUT_RDWR);
        m_thread.join();
        ::close(m_listening);
    }
    std::string const& port() const { return m_port; }

private:
    // One client after the other, each until it leaves.
    void serve()
    {
        for (int client = ::accept(m_listening, nullptr, nullptr); client >= 0;
             client = ::accept(m_listening, nullptr, nullptr)) {
            char heard[64];
            std::string said = ::recv(client, heard, sizeof heard, 0) > 0 ? "ELM327 v1.5\r\r>" : "";
            while (!said.empty() && ::send(client, said.data(), said.size(), MSG_NOSIGNAL) > 0) {
                said = m_flood;
            }
            ::close(client);
        }
    }

    int const m_listening;
    std::string m_flood;
    std::string m_port;
    std::thread m_thread;
};

TEST(Trouble, AFloodEndsCommandsOrIsInterruptedAtOnce)
{
    using std::chrono::steady_clock;
    FloodingServer const prompts(">");
    std::string commands;
    for (int i = 0; i < 50; ++i) {
        commands += "ATI\n"; // the first ones may be asked before the flood has come
    }
    auto start = steady_clock::now();
    Outcome const console = runVelmora({"-q", "-p", prompts.port(), "console"}, commands);
    EXPECT_EQ(console.exitCode, 8) << console.err;
    EXPECT_TRUE(contains(console.err, "has no end")) << console.err;
    EXPECT_LT(steady_clock::now() - start, std::chrono::seconds(5));

    FloodingServer const data("7E8064100BE3FB813");
    ChildProcess doctor({"-q", "-p", data.port(), "doctor"});
    std::this_thread::sleep_for(std::chrono::milliseconds(700));
    doctor.interrupt();
    start = steady_clock::now();
    EXPECT_EQ(doctor.wait(), 130);
    EXPECT_LT(steady_clock::now() - start, std::chrono::seconds(2));
}

TEST(Trouble, TheAdaptersWordIsTold)
{
    std::vector<std::string> faults;
    for (int command = 37; command < 80; ++command) {
        faults.push_back("error:CAN ERROR@" + std::to_string(command));
    }
    FaultyCar const car(faults);
    Outcome const outcome = runVelmora({"-q", "-p", car.port(), "counters"});
    EXPECT_EQ(outcome.exitCode, 5) << outcome.err;
    EXPECT_TRUE(contains(outcome.err, "CAN ERROR")) << outcome.err;
}

TEST(Trouble, ReadersThatGoEarlyEndAllCommandsAlike)
{
    for (char const* command : {"scan", "sensors", "live", "--json live", "live --csv -", "log RPM"}) {
        std::string const shell = std::string("bash -c '" VELMORA_PROGRAM " -q -p sim:petrol-can11?instant ") +
                                  command + " | head -n 1 > /dev/null; exit ${PIPESTATUS[0]}'";
        int const status = std::system(shell.c_str());
        EXPECT_EQ(WEXITSTATUS(status), 0) << command;
    }
}

TEST(Trouble, FilesWithoutAnEndOrABeginningAreRefusedAtOnce)
{
    std::string const pipe = testsupport::ownPath("pipe");
    std::remove(pipe.c_str());
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    auto const start = std::chrono::steady_clock::now();
    for (std::string const& file : {std::string("/dev/zero"), pipe}) {
        for (std::vector<std::string> const& arguments : {std::vector<std::string>{"--settings", file, "settings"},
                                                          {"-p", "sim:" + file, "info"},
                                                          {"-p", "replay:" + file, "info"},
                                                          {"simulate", "--vehicle", file},
                                                          {"simulate", "--replay", file},
                                                          {"simulate", "--scenario", file},
                                                          {"watch", "--config", file},
                                                          {"signals", "check", file},
                                                          {"signals", "import", file},
                                                          {"-p", "sim:", "--signals", file, "live", "RPM"},
                                                          {"history", "import", file},
                                                          {"live", "--play", file},
                                                          {"trips", file},
                                                          {"-p", "sim:", "watch", "--output", "csv:" + file},
                                                          {"-p", "sim:", "watch", "--output", "sqlite:" + file},
                                                          {"-p", "sim:", "record", file},
                                                          {"-p", "sim:", "doctor", "--bundle", file}}) {
            Outcome const outcome = runVelmora(arguments);
            EXPECT_NE(outcome.exitCode, 0) << file << " " << arguments[arguments.size() - 2];
            EXPECT_TRUE(contains(outcome.err, file)) << outcome.err;
        }
    }
    // Nobody reads the pipe, so whoever opens it to write would wait for ever.
    std::string const html = pipe + ".html";
    ASSERT_EQ(std::rename(pipe.c_str(), html.c_str()), 0);
    for (std::vector<std::string> const& arguments : {std::vector<std::string>{"--log", html, "info"},
                                                      {"--trace", html, "info"},
                                                      {"scan", "--no-history", "--force", "--report", html},
                                                      {"doctor", "--force", "--bundle", html},
                                                      {"live", "RPM", "-n", "1", "--force", "--csv", html},
                                                      {"signals", "probe", "--service", "22", "--from", "F190", "--to",
                                                       "F190", "--module", "7E0", "--force", "--output", html},
                                                      {"history", "export", html},
                                                      {"simulate", "--trace", html},
                                                      {"simulate", "--write-scenario", html}}) {
        std::vector<std::string> all = {"-p", "sim:petrol-can11?instant"};
        all.insert(all.end(), arguments.begin(), arguments.end());
        Outcome const outcome = runVelmora(all);
        EXPECT_NE(outcome.exitCode, 0) << arguments.front();
        EXPECT_TRUE(contains(outcome.err, html)) << outcome.err;
    }
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(30));
    std::remove(html.c_str());
}

TEST(Trouble, TheBundleReplacesNoFileUnlessItMay)
{
    std::string const file = testsupport::ownPath("bundle.txt");
    std::ofstream(file) << "keep me";
    Outcome const refused = runVelmora({"-p", "sim:petrol-can11?instant", "doctor", "--bundle", file});
    EXPECT_EQ(refused.exitCode, 2);
    EXPECT_TRUE(contains(refused.err, "--force")) << refused.err;
    EXPECT_EQ(std::filesystem::file_size(file), 7U);
    runVelmora({"-q", "-p", "sim:petrol-can11?instant", "doctor", "--bundle", file, "--force"});
    EXPECT_GT(std::filesystem::file_size(file), 500U);
    std::remove(file.c_str());
}

TEST(Trouble, SettingsSurviveAKillWhole)
{
    std::string const file = testsupport::ownPath("killed.toml");
    ASSERT_EQ(runVelmora({"--settings", file, "settings", "weight", "1111"}).exitCode, 0);
    for (int i = 0; i < 30; ++i) {
        std::string const command = "timeout -s KILL 0.0" + std::to_string(10 + i) +
                                    " " VELMORA_PROGRAM " --settings " + file + " settings weight 2222 > /dev/null";
        [[maybe_unused]] int const status = std::system(command.c_str());
        std::ifstream in(file);
        std::string const text{std::istreambuf_iterator<char>(in), {}};
        EXPECT_TRUE(text == "[common]\nvehicleweight = 1111\n" || text == "[common]\nvehicleweight = 2222\n") << text;
    }
    EXPECT_EQ(runVelmora({"--settings", file, "settings", "weight"}).exitCode, 0);
    std::ofstream(file) << "[common]\nvehicleweigth = 1111\n[history]\nkeep = 0\nvehicle = 'van'\nkept = 1\n";
    Outcome const listed = runVelmora({"--settings", file, "settings"});
    EXPECT_EQ(listed.exitCode, 0);
    EXPECT_EQ(listed.err, "Nothing reads common/vehicleweigth, history/kept in " + file + "\n");
}

TEST(Trouble, AFullDiskUnderTheSimulatorsTraceIsExitCodeOne)
{
    ChildProcess simulator({"simulate", "--listen", "tcp://127.0.0.1:0", "--trace", "/dev/full"});
    runVelmora({"-q", "-p", simulator.readLine(), "console"}, "ATI\n");
    simulator.interrupt();
    EXPECT_EQ(simulator.wait(), 1);
}

TEST(Trouble, ConsoleShowsEachLineOfALongReply)
{
    Outcome const outcome = runVelmora({"-q", "-p", "sim:petrol-can11?instant", "console"}, "ATS0\n0902\n03ZZ\n0101\n");
    EXPECT_EQ(outcome.out, "OK\nSEARCHING...\n014\n0:49020156454C\n1:4D524153314D4D\n2:30303030303031\n?\n"
                           "41018207E524\n410100040000\n");
}

TEST(Trouble, ATerminalShowsWhatTheOpeningIsAt)
{
    Outcome const outcome = runOnTerminal({"-p", "sim:petrol-iso9141", "counters"});
    EXPECT_TRUE(contains(outcome.out, "\r\033[KSearching for the bus ... 1 s")) << outcome.out;
    EXPECT_TRUE(contains(outcome.out, "\r\033[KControl module")) << "the line goes when it is over: " << outcome.out;
}

} // namespace
