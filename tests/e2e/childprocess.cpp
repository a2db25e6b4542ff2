#include "tests/e2e/childprocess.h"

#include <gtest/gtest.h>

#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/ioctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

extern char** environ;

namespace e2e {

namespace {

constexpr std::chrono::minutes limit(2);

struct Pipe
{
    Pipe()
    {
        std::array<int, 2> ends{};
        EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0);
        read = ends[0];
        write = ends[1];
    }
    int read;
    int write;
};

// Of all programs that are started; once, since other threads may be starting some.
void setEnvironment()
{
    static int const set =
        ::setenv("VELMORA_SETTINGS", "/proc/nonexistent/settings.toml", 1) | // not the user's, nor any
        ::setenv("TERM", "xterm", 1);
    EXPECT_EQ(set, 0);
}

pid_t spawn(std::vector<std::string> const& arguments, int in, int out, int err)
{
    std::vector<std::string> all = {VELMORA_PROGRAM};
    all.insert(all.end(), arguments.begin(), arguments.end());
    std::vector<char*> argv;
    for (std::string& argument : all) {
        argv.push_back(argument.data());
    }
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    for (auto const& [from, to] : {std::pair(in, STDIN_FILENO), {out, STDOUT_FILENO}, {err, STDERR_FILENO}}) {
        if (from >= 0) {
            posix_spawn_file_actions_adddup2(&actions, from, to);
        }
    }
    setEnvironment();
    pid_t pid = -1;
    EXPECT_EQ(::posix_spawn(&pid, VELMORA_PROGRAM, &actions, nullptr, argv.data(), environ), 0);
    posix_spawn_file_actions_destroy(&actions);
    return pid;
}

int exitCodeOf(int status)
{
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

// Reads both until both have ended.
void drain(pid_t pid, int out, int err, Outcome& outcome)
{
    auto const end = std::chrono::steady_clock::now() + limit;
    std::array<pollfd, 2> sources{pollfd{out, POLLIN, 0}, pollfd{err, POLLIN, 0}};
    std::array<std::string*, 2> targets{&outcome.out, &outcome.err};
    while (sources[0].fd >= 0 || sources[1].fd >= 0) {
        ::poll(sources.data(), sources.size(), 1000);
        if (std::chrono::steady_clock::now() > end) {
            ADD_FAILURE() << "the program does not end";
            ::kill(pid, SIGKILL);
        }
        for (std::size_t i = 0; i < sources.size(); ++i) {
            if (sources[i].fd >= 0 && sources[i].revents != 0) {
                std::array<char, 4096> bytes{};
                ssize_t const count = ::read(sources[i].fd, bytes.data(), bytes.size());
                if (count > 0) {
                    targets[i]->append(bytes.data(), static_cast<std::size_t>(count));
                } else {
                    sources[i].fd = -1;
                }
            }
        }
    }
}

} // namespace

Outcome runVelmora(std::vector<std::string> const& arguments, std::string const& input)
{
    Pipe const in;
    Pipe const out;
    Pipe const err;
    pid_t const pid = spawn(arguments, in.read, out.write, err.write);
    ::close(in.read);
    ::close(out.write);
    ::close(err.write);
    EXPECT_EQ(::write(in.write, input.data(), input.size()), static_cast<ssize_t>(input.size()));
    ::close(in.write);
    Outcome outcome{};
    drain(pid, out.read, err.read, outcome);
    int status = 0;
    ::waitpid(pid, &status, 0);
    ::close(out.read);
    ::close(err.read);
    outcome.exitCode = exitCodeOf(status);
    return outcome;
}

Outcome runOnTerminal(std::vector<std::string> const& arguments, std::string const& typed, std::string const& question,
                      std::string answer)
{
    int const keyboard = ::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    EXPECT_EQ(::grantpt(keyboard), 0);
    EXPECT_EQ(::unlockpt(keyboard), 0);
    std::array<char, 64> name{};
    EXPECT_EQ(::ptsname_r(keyboard, name.data(), name.size()), 0);
    int const terminal = ::open(name.data(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    winsize const size{24, 80, 0, 0};
    EXPECT_EQ(::ioctl(terminal, TIOCSWINSZ, &size), 0);
    pid_t const pid = spawn(arguments, terminal, terminal, terminal);
    ::close(terminal);
    auto const type = [keyboard](std::string const& text) {
        EXPECT_EQ(::write(keyboard, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    };
    type(typed);
    Outcome outcome{};
    auto const end = std::chrono::steady_clock::now() + limit;
    while (true) {
        pollfd source{keyboard, POLLIN, 0};
        ::poll(&source, 1, 1000);
        if (std::chrono::steady_clock::now() > end) {
            ADD_FAILURE() << "the program does not end";
            ::kill(pid, SIGKILL);
        }
        std::array<char, 4096> bytes{};
        ssize_t const count = source.revents != 0 ? ::read(keyboard, bytes.data(), bytes.size()) : 0;
        if (source.revents != 0 && count <= 0) {
            break; // nobody has the terminal open any more
        }
        outcome.out.append(bytes.data(), static_cast<std::size_t>(count));
        if (!answer.empty() && outcome.out.find(question) != std::string::npos) {
            type(std::exchange(answer, {}));
        }
    }
    int status = 0;
    ::waitpid(pid, &status, 0);
    ::close(keyboard);
    outcome.exitCode = exitCodeOf(status);
    return outcome;
}

ChildProcess::ChildProcess(std::vector<std::string> const& arguments)
{
    Pipe const out;
    m_pid = spawn(arguments, -1, out.write, -1);
    m_out = out.read;
    ::close(out.write);
}

ChildProcess::~ChildProcess()
{
    if (m_pid > 0) {
        ::kill(m_pid, SIGTERM);
        wait();
    }
    ::close(m_out);
}

std::string ChildProcess::readLine()
{
    std::string line;
    char byte = 0;
    while (::read(m_out, &byte, 1) == 1 && byte != '\n') {
        line += byte;
    }
    return line;
}

void ChildProcess::interrupt() const
{
    ::kill(m_pid, SIGINT);
}

void ChildProcess::hangUp() const
{
    ::kill(m_pid, SIGHUP);
}

int ChildProcess::wait()
{
    int status = 0;
    ::waitpid(m_pid, &status, 0);
    m_pid = -1;
    return exitCodeOf(status);
}

} // namespace e2e
