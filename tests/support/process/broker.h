#pragma once

#include "libvelmora/output/mqtt/mqttoutput.h"
#include "tests/support/process/serverprocess.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

// A real broker, and what the tests of the output to it need.
namespace testsupport {

inline velmora::OutputContext brokerContext(TemporaryFolder const& folder)
{
    velmora::OutputContext context;
    context.vehicle = "van";
    context.stateFolder = folder.path();
    return context;
}

inline std::string brokerText(unsigned short port)
{
    return "mqtt://127.0.0.1:" + std::to_string(port) + "/cars";
}

// As root the broker would become another user, who can't read the folder.
inline std::vector<std::string> mosquittoCommand(TemporaryFolder const& folder, unsigned short port,
                                                 std::string const& settings = "allow_anonymous true\n")
{
    std::ofstream(folder.file("broker.conf")) << "user root\nlistener " << port << " 127.0.0.1\n" << settings;
    return {"/usr/sbin/mosquitto", "-c", folder.file("broker.conf")};
}

// What comes on topics, at most so many messages within 20 s, each a line of topic, blank, payload.
class Subscriber
{
public:
    Subscriber(unsigned short port, std::string const& topics, int count, std::string const& options = "")
        : m_pipe(::popen(("stdbuf -oL mosquitto_sub -h 127.0.0.1 -V mqttv311 -p " + std::to_string(port) + " " +
                          topics + " -C " + std::to_string(count) + " -W 20 -q 1 -F '%t %p' " + options)
                             .c_str(),
                         "r"))
    {}
    ~Subscriber()
    {
        if (m_pipe != nullptr) {
            ::pclose(m_pipe);
        }
    }
    Subscriber(Subscriber const&) = delete;
    Subscriber& operator=(Subscriber const&) = delete;

    // The next message; empty if none comes.
    std::string readLine()
    {
        std::string line;
        for (int each = std::fgetc(m_pipe); each != EOF && each != '\n'; each = std::fgetc(m_pipe)) {
            line += static_cast<char>(each);
        }
        return line;
    }
    // All that have not been read.
    std::vector<std::string> lines()
    {
        std::string all;
        for (char buffer[4096]; std::fgets(buffer, sizeof(buffer), m_pipe) != nullptr;) {
            all += buffer;
        }
        std::vector<std::string> result;
        std::istringstream in(all);
        for (std::string line; std::getline(in, line);) {
            result.push_back(line);
        }
        return result;
    }

private:
    std::FILE* m_pipe;
};

inline std::int64_t rowsLeft(TemporaryFolder const& folder)
{
    return velmora::Database(folder.file("spool-van.db"), velmora::Database::Access::ReadOnly)
        .number("SELECT count(*) FROM row");
}

// Looks for up to 20 s.
template <typename Condition>
bool comesTrue(Condition const& condition)
{
    for (int i = 0; i < 400; ++i) {
        if (condition()) {
            return true;
        }
        ::usleep(50000);
    }
    return false;
}

inline bool isEmptied(TemporaryFolder const& folder)
{
    return comesTrue([&] { return rowsLeft(folder) == 0; });
}

} // namespace testsupport
