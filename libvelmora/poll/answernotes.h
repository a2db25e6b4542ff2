#pragma once

#include <chrono>
#include <map>
#include <optional>
#include <set>
#include <utility>

namespace velmora {

// Which control module answered which PID of service 01, and when, since the connection stands.
class AnswerNotes
{
public:
    using Time = std::chrono::steady_clock::time_point;

    void note(unsigned int module, unsigned char pid, Time time) { m_times[{module, pid}] = time; }

    // Nothing if the module has never answered it.
    std::optional<Time> last(unsigned int module, unsigned char pid) const;

    // Whether the module answered each of the PIDs, none of it longer ago than that.
    bool areFresh(unsigned int module, std::set<unsigned char> const& pids, Time now,
                  std::chrono::milliseconds oldest) const;

private:
    std::map<std::pair<unsigned int, unsigned char>, Time> m_times;
};

} // namespace velmora
