#include "libvelmora/poll/deadlinescheduler.h"

#include <algorithm>

namespace velmora {

std::size_t DeadlineScheduler::add(std::optional<double> hertz, PollTime now)
{
    std::chrono::nanoseconds const period(hertz ? static_cast<long long>(1e9 / *hertz) : 0);
    m_tasks.push_back({period, now, PollTime::min()});
    return m_tasks.size() - 1;
}

// Equals go in the order in which they were added.
template <typename Before, typename Suits>
DeadlineScheduler::Task const* DeadlineScheduler::first(Before const& before, Suits const& suits) const
{
    Task const* best = nullptr;
    for (Task const& task : m_tasks) {
        if (suits(task) && (best == nullptr || before(task, *best))) {
            best = &task;
        }
    }
    return best;
}

DeadlineScheduler::Task const* DeadlineScheduler::chooseWithRate(PollTime now) const
{
    auto const waitedLonger = [](Task const& a, Task const& b) { return a.last < b.last; };
    auto const isLate = [now](Task const& task) { return task.hasRate() && task.deadline() < now; };
    if (Task const* const late = first(waitedLonger, isLate)) {
        return late;
    }
    auto const isEarlier = [](Task const& a, Task const& b) {
        return a.deadline() < b.deadline() || (a.deadline() == b.deadline() && a.last < b.last);
    };
    return first(isEarlier, [now](Task const& task) { return task.hasRate() && task.release <= now; });
}

DeadlineScheduler::Task const* DeadlineScheduler::choose(PollTime now) const
{
    Task const* const withRate = chooseWithRate(now);
    Task const* const without = first([](Task const& a, Task const& b) { return a.last < b.last; },
                                      [now](Task const& task) { return !task.hasRate() && task.release <= now; });
    if (withRate == nullptr || (without != nullptr && m_turnsOfRates >= turnsOfRates)) {
        return without;
    }
    return withRate;
}

std::optional<DeadlineScheduler::Turn> DeadlineScheduler::next(PollTime now) const
{
    Task const* task = choose(now);
    if (task == nullptr) {
        task = first([](Task const& a, Task const& b) { return a.release < b.release; },
                     [](Task const& /*task*/) { return true; });
    }
    if (task == nullptr) {
        return std::nullopt;
    }
    return Turn{static_cast<std::size_t>(task - m_tasks.data()), std::max(task->release, now)};
}

// A task that is late keeps its rhythm, but no more than one turn is made up for.
void DeadlineScheduler::started(std::size_t task, PollTime now)
{
    Task& each = m_tasks[task];
    each.last = now;
    m_turnsOfRates = each.hasRate() ? m_turnsOfRates + 1 : 0;
    each.release = each.hasRate() ? std::max(each.deadline(), now - each.period) : now;
}

void DeadlineScheduler::postpone(std::size_t task, PollTime until)
{
    m_tasks[task].release = std::max(m_tasks[task].release, until);
}

} // namespace velmora
