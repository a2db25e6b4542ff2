#pragma once

#include <chrono>
#include <optional>
#include <string>

namespace velmora {

// Talks to the service manager that started this process, if one did. On the thread that does the work, so that the
// watchdog sees when that hangs.
class ServiceNotify
{
public:
    // By NOTIFY_SOCKET, WATCHDOG_USEC and WATCHDOG_PID.
    ServiceNotify();

    // "READY=1", "STATUS=...", several lines at once. Nobody listening is no failure.
    void tell(std::string const& state) const;
    // Says that the work goes on, twice in each period of the watchdog.
    void alive(std::chrono::steady_clock::time_point now);

private:
    std::string m_socket;
    std::optional<std::chrono::microseconds> m_period;
    std::chrono::steady_clock::time_point m_next;
};

} // namespace velmora
