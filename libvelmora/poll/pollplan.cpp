#include "libvelmora/poll/pollplan.h"

#include <algorithm>

namespace velmora {

namespace {

std::size_t limitOf(PollWish const& wish, MultiLimits const& limits, PidLength const& length)
{
    auto const found = limits.find(wish.module);
    bool const alone = found == limits.end() || found->second.isAlone(wish.pid) || !length(wish.pid);
    return alone ? 1 : found->second.now();
}

// The PIDs of one rate, each with the smallest limit of the modules that are meant.
struct RateGroup
{
    std::optional<double> hertz;
    std::vector<unsigned char> pids; // in the order of the wishes
    std::map<unsigned char, std::size_t> limits;
};

// The fastest of a PID's rates, for one request serves all.
std::optional<double> fastest(std::vector<PollWish> const& wishes, unsigned char pid)
{
    std::optional<double> hertz;
    for (PollWish const& wish : wishes) {
        if (!wish.derived && wish.pid == pid && wish.hertz) {
            hertz = std::max(hertz.value_or(0.0), *wish.hertz);
        }
    }
    return hertz;
}

std::vector<RateGroup> groupByRate(std::vector<PollWish> const& wishes, MultiLimits const& limits,
                                   PidLength const& length)
{
    std::vector<RateGroup> groups;
    for (PollWish const& wish : wishes) {
        if (wish.derived) {
            continue;
        }
        std::optional<double> const hertz = fastest(wishes, wish.pid);
        auto group = std::find_if(groups.begin(), groups.end(), [&](auto const& each) { return each.hertz == hertz; });
        if (group == groups.end()) {
            group = groups.insert(groups.end(), {hertz, {}, {}});
        }
        auto const [limit, isNew] = group->limits.try_emplace(wish.pid, limitOf(wish, limits, length));
        limit->second = std::min(limit->second, limitOf(wish, limits, length));
        if (isNew) {
            group->pids.push_back(wish.pid);
        }
    }
    return groups;
}

PollTask makeTask(std::vector<unsigned char> const& pids, std::optional<double> hertz,
                  std::vector<PollWish> const& wishes)
{
    PollTask task{pids, {}, hertz};
    for (std::size_t i = 0; i < wishes.size(); ++i) {
        if (!wishes[i].derived && std::find(pids.begin(), pids.end(), wishes[i].pid) != pids.end()) {
            task.members.push_back(i);
        }
    }
    return task;
}

void addTasks(std::vector<PollTask>& tasks, RateGroup const& group, std::vector<PollWish> const& wishes)
{
    std::map<std::size_t, std::vector<unsigned char>> byLimit;
    for (unsigned char const pid : group.pids) {
        byLimit[group.limits.at(pid)].push_back(pid);
    }
    for (auto const& [limit, pids] : byLimit) {
        for (std::vector<unsigned char> const& each : evenGroups(pids, limit)) {
            tasks.push_back(makeTask(each, group.hertz, wishes));
        }
    }
}

} // namespace

std::vector<std::vector<unsigned char>> evenGroups(std::vector<unsigned char> const& pids, std::size_t most)
{
    std::vector<std::vector<unsigned char>> groups;
    std::size_t const count = (pids.size() + most - 1) / most;
    for (std::size_t i = 0; i < count; ++i) {
        auto const begin = static_cast<std::ptrdiff_t>(i * pids.size() / count);
        auto const end = static_cast<std::ptrdiff_t>((i + 1) * pids.size() / count);
        groups.emplace_back(pids.begin() + begin, pids.begin() + end);
    }
    return groups;
}

std::vector<PollTask> planPolling(std::vector<PollWish> const& wishes, MultiLimits const& limits,
                                  PidLength const& length)
{
    std::vector<PollTask> tasks;
    for (RateGroup const& group : groupByRate(wishes, limits, length)) {
        addTasks(tasks, group, wishes);
    }
    for (std::size_t i = 0; i < wishes.size(); ++i) {
        if (wishes[i].derived) {
            tasks.push_back({{}, {i}, wishes[i].hertz});
        }
    }
    return tasks;
}

} // namespace velmora
