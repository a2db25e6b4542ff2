#pragma once

#include "simulator/server.h"
#include "simulator/simulation.h"

#include <csignal>
#include <stdexcept>
#include <string>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

// A simulated car in a process of its own, so that its work is not counted.
class CarProcess
{
public:
    explicit CarProcess(obdsim::SimulationOptions const& car)
    {
        int ends[2] = {-1, -1};
        if (::pipe(ends) != 0) {
            throw std::runtime_error("no pipe");
        }
        m_process = ::fork();
        if (m_process == 0) {
            ::prctl(PR_SET_PDEATHSIG, SIGKILL);
            auto const server = obdsim::serveTcp(obdsim::simulate(car), "127.0.0.1", 0);
            std::string const address = server->address() + "\n";
            if (::write(ends[1], address.data(), address.size()) > 0) {
                server->run();
            }
            ::_exit(0);
        }
        for (char each = 0; ::read(ends[0], &each, 1) == 1 && each != '\n';) {
            m_address += each;
        }
        ::close(ends[0]);
        ::close(ends[1]);
    }
    ~CarProcess()
    {
        ::kill(m_process, SIGKILL);
        ::waitpid(m_process, nullptr, 0);
    }
    CarProcess(CarProcess const&) = delete;
    CarProcess& operator=(CarProcess const&) = delete;

    std::string const& address() const { return m_address; }

private:
    pid_t m_process = -1;
    std::string m_address;
};
