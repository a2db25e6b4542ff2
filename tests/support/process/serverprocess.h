#pragma once

#include <arpa/inet.h>
#include <csignal>
#include <fcntl.h>
#include <string>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace testsupport {

// A port of loopback that nobody uses now.
inline unsigned short freePort()
{
    int const probe = ::socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t length = sizeof(address);
    ::bind(probe, reinterpret_cast<sockaddr*>(&address), length);
    ::getsockname(probe, reinterpret_cast<sockaddr*>(&address), &length);
    ::close(probe);
    return ntohs(address.sin_port);
}

// A server program of a test, killed with it.
class ServerProcess
{
public:
    // Comes back when something listens on the port, or after 20 s.
    ServerProcess(std::vector<std::string> command, unsigned short port) : m_pid(::fork())
    {
        if (m_pid == 0) {
            std::vector<char*> words;
            for (std::string& each : command) {
                words.push_back(each.data());
            }
            words.push_back(nullptr);
            int const nowhere = ::open("/dev/null", O_WRONLY);
            ::dup2(nowhere, STDOUT_FILENO);
            ::dup2(nowhere, STDERR_FILENO);
            ::execvp(words.front(), words.data());
            ::_exit(127);
        }
        for (int i = 0; i < 400 && !listens(port); ++i) {
            ::usleep(50000);
        }
    }
    ~ServerProcess()
    {
        ::kill(m_pid, SIGKILL);
        ::waitpid(m_pid, nullptr, 0);
    }
    ServerProcess(ServerProcess const&) = delete;
    ServerProcess& operator=(ServerProcess const&) = delete;

    // Lets it read its settings again, as services do.
    void reload() const { ::kill(m_pid, SIGHUP); }

private:
    static bool listens(unsigned short port)
    {
        int const probe = ::socket(AF_INET, SOCK_STREAM, 0);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(port);
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        bool const connected = ::connect(probe, reinterpret_cast<sockaddr*>(&address), sizeof(address)) == 0;
        ::close(probe);
        return connected;
    }

    pid_t m_pid;
};

} // namespace testsupport
