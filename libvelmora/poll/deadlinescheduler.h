#pragma once

#include <chrono>
#include <cstddef>
#include <optional>
#include <vector>

namespace velmora {

using PollTime = std::chrono::steady_clock::time_point;

// Says whose turn it is on a bus that takes one request at a time. A task with a rate is released once a period and has
// the period to be done in; tasks without a rate share what is left, the one that waited longest first. While nothing
// is late, the earliest deadline goes first, so a fast sensor is not held up by slow ones. Where more is asked than the
// bus can do, those that missed their deadline take turns: who asks for little still gets it, and the others share the
// rest evenly. Reads no clock.
class DeadlineScheduler
{
public:
    struct Turn
    {
        std::size_t task;
        PollTime start; // not before
    };

    // The number of the new task, from 0 on. hertz must be above 0; without it the task has no rate.
    std::size_t add(std::optional<double> hertz, PollTime now);

    // The task to be run now, or the first one to come. Nothing without tasks.
    std::optional<Turn> next(PollTime now) const;

    // Says that the task has begun a turn.
    void started(std::size_t task, PollTime now);

    // Holds a task back, such as one whose sensor stays silent.
    void postpone(std::size_t task, PollTime until);

private:
    struct Task
    {
        std::chrono::nanoseconds period; // 0 without a rate
        PollTime release;
        PollTime last; // begin of the last turn

        bool hasRate() const { return period.count() > 0; }
        PollTime deadline() const { return release + period; }
    };

    // Of so many turns one belongs to the tasks without a rate, however many rates are asked for.
    static constexpr int turnsOfRates = 3;

    template <typename Before, typename Suits>
    Task const* first(Before const& before, Suits const& suits) const;
    Task const* choose(PollTime now) const;
    Task const* chooseWithRate(PollTime now) const;

    std::vector<Task> m_tasks;
    int m_turnsOfRates = 0; // since the last turn of a task without a rate
};

} // namespace velmora
