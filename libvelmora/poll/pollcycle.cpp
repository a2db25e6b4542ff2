#include "libvelmora/poll/pollcycle.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr unsigned char currentData = 0x01;
constexpr unsigned char negativeReply = 0x7F;
constexpr unsigned int replyLimitMs = 1500;
constexpr int mostFailures = 3;                 // failed turns in a row
constexpr std::chrono::seconds silencePause{2}; // so that what stays silent does not hold up the rest

std::set<unsigned int> modulesOf(std::vector<std::size_t> const& members, std::vector<PollWish> const& wishes)
{
    std::set<unsigned int> modules;
    for (std::size_t const member : members) {
        modules.insert(wishes[member].module);
    }
    return modules;
}

} // namespace

PollCycle::PollCycle(std::shared_ptr<obd::IObdProxy> const& proxy, std::vector<PollSource> const& sources,
                     PollPace const& pace, PidLength length, Units units, Sink sink, IChannelControl* channel)
    : m_wire(proxy, pace.gap, channel), m_pace(pace), m_length(std::move(length)), m_sink(std::move(sink))
{
    for (PollSource const& source : sources) {
        if (source.guest != nullptr) {
            m_guests.push_back({source.guest, source.hertz, source.guest->wishes(), 0});
            continue;
        }
        auto parameter = std::make_unique<PolledParameter>(m_wire, source.ecu, source.parameter, units);
        auto const pid = static_cast<unsigned char>(source.parameter->pid());
        m_wishes.push_back({source.ecu->id(), pid, source.hertz, parameter->isDerived()});
        m_parameters.push_back(std::move(parameter));
        m_limits.try_emplace(source.ecu->id(), pace.pidsPerRequest);
    }
    m_mayAddress = pace.addresses && channel != nullptr && proxy->ecus().size() > 1;
    std::size_t meters = m_wishes.size();
    for (Guest& guest : m_guests) {
        guest.first = meters;
        meters += guest.wishes.size();
    }
    m_meters.resize(meters);
    m_silent.resize(meters, 0);
    plan();
}

void PollCycle::plan()
{
    m_tasks = planPolling(m_wishes, m_limits, m_length);
    m_failures.assign(m_tasks.size() + m_guests.size(), 0);
    m_scheduler = DeadlineScheduler();
    PollTime const now = m_wire.now();
    for (PollTask const& task : m_tasks) {
        m_scheduler.add(task.hertz, now);
    }
    for (Guest const& guest : m_guests) {
        m_scheduler.add(guest.hertz, now);
    }
}

std::chrono::milliseconds PollCycle::wait()
{
    PollTime const now = m_wire.now();
    std::optional<DeadlineScheduler::Turn> const turn = m_scheduler.next(now);
    PollTime const start = turn ? std::max(turn->start, m_notBefore) : now + silencePause;
    return start > now ? std::chrono::ceil<std::chrono::milliseconds>(start - now) : std::chrono::milliseconds(0);
}

void PollCycle::step()
{
    PollTime const start = m_wire.now();
    std::optional<DeadlineScheduler::Turn> const turn = m_scheduler.next(start);
    if (!turn) {
        return;
    }
    std::size_t const task = turn->task;
    m_scheduler.started(task, start);
    bool const isGuest = task >= m_tasks.size();
    if (isGuest ? runGuest(m_guests[task - m_tasks.size()]) : run(m_tasks[task])) {
        m_failures[task] = 0;
        m_notBefore = start + m_pace.floor;
    } else if (++m_failures[task] >= mostFailures) {
        m_scheduler.postpone(task, m_wire.now() + silencePause);
    }
    if (std::exchange(m_limitsChanged, false)) {
        plan();
    }
}

// What is of one module only may go to its own address, if that proves quicker than the replies of all.
obd::IDevice::Status PollCycle::ask(std::vector<unsigned char> const& request, std::set<unsigned int> const& modules,
                                    obd::ResponseMap& responses)
{
    if (!m_mayAddress || modules.size() != 1) {
        return m_wire.execute(request, responses, replyLimitMs);
    }
    unsigned int const module = *modules.begin();
    AddressTrial& trial = m_trials[{module, request}];
    PollTime const start = m_wire.now();
    obd::IDevice::Status const status =
        m_wire.execute(request, responses, replyLimitMs, trial.isAddressed() ? std::optional(module) : std::nullopt);
    if (responses.contains(module)) {
        trial.answered(std::chrono::duration_cast<std::chrono::milliseconds>(m_wire.now() - start));
    } else {
        trial.missed();
    }
    return status;
}

bool PollCycle::run(PollTask const& task)
{
    if (task.pids.empty()) {
        return runDerived(task.members.front());
    }
    for (std::size_t const member : task.members) {
        m_parameters[member]->begin();
    }
    return task.pids.size() > 1 ? runMulti(task) : runSingle(task);
}

bool PollCycle::runGuest(Guest& guest)
{
    std::vector<PollResult> const results = guest.guest->turn(m_wire);
    {
        std::lock_guard const lock(m_mutex);
        m_now = m_wire.now();
        for (std::size_t i = 0; i < guest.wishes.size(); ++i) {
            bool const told = std::any_of(results.begin(), results.end(), [&](PollResult const& result) {
                return result.module == guest.wishes[i].module && result.id == guest.wishes[i].id;
            });
            if (told) {
                m_meters[guest.first + i].count(m_now);
            }
            m_silent[guest.first + i] = told ? 0 : m_silent[guest.first + i] + 1;
        }
    }
    for (PollResult const& result : results) {
        m_sink(result);
    }
    return !results.empty();
}

bool PollCycle::runSingle(PollTask const& task)
{
    obd::ResponseMap responses;
    ask({currentData, task.pids.front()}, modulesOf(task.members, m_wishes), responses);
    bool success = false;
    for (std::size_t const member : task.members) {
        auto const found = responses.find(m_wishes[member].module);
        m_parameters[member]->lend(task.pids.front(),
                                   found != responses.end() ? found->second : std::vector<unsigned char>());
        success |= finish(member);
    }
    return success;
}

bool PollCycle::runMulti(PollTask const& task)
{
    std::map<unsigned int, Parts> const parts = fetch(task.pids, modulesOf(task.members, m_wishes));
    bool success = false;
    for (std::size_t const member : task.members) {
        PollWish const& wish = m_wishes[member];
        auto const found = parts.find(wish.module);
        if (found == parts.end()) {
            continue; // asked again, alone or in the next turn
        }
        if (auto const part = found->second.find(wish.pid); part != found->second.end()) {
            m_parameters[member]->lend(wish.pid, part->second);
            success |= finish(member);
        } else {
            m_limits.at(wish.module).leftOut(wish.pid);
            m_limitsChanged = true;
        }
    }
    return success;
}

// A derived value asks for its inputs itself; those that it asked for the last time are fetched together for it, as far
// as its module takes that.
bool PollCycle::runDerived(std::size_t member)
{
    PolledParameter& parameter = *m_parameters[member];
    std::vector<unsigned char> const inputs = usualInputs(parameter);
    parameter.begin();
    std::size_t const limit = m_limits.at(parameter.module()).now();
    if (limit > 1 && inputs.size() > 1) {
        for (std::vector<unsigned char> const& group : evenGroups(inputs, limit)) {
            if (group.size() > 1) {
                lendGroup(parameter, group);
            }
        }
    }
    finish(member);
    return parameter.answered();
}

std::vector<unsigned char> PollCycle::usualInputs(PolledParameter const& parameter) const
{
    MultiLimit const& limit = m_limits.at(parameter.module());
    std::vector<unsigned char> inputs;
    for (unsigned char const pid : parameter.inputs()) {
        if (m_length(pid) && !limit.isAlone(pid)) {
            inputs.push_back(pid);
        }
    }
    return inputs;
}

void PollCycle::lendGroup(PolledParameter& parameter, std::vector<unsigned char> const& pids)
{
    std::map<unsigned int, Parts> const parts = fetch(pids, {parameter.module()});
    auto const found = parts.find(parameter.module());
    if (found == parts.end()) {
        return;
    }
    for (unsigned char const pid : pids) {
        if (auto const part = found->second.find(pid); part != found->second.end()) {
            parameter.lend(pid, part->second);
        } else {
            m_limits.at(parameter.module()).leftOut(pid);
        }
    }
}

// The parts of the replies of those modules whose reply can be taken apart.
std::map<unsigned int, PollCycle::Parts> PollCycle::fetch(std::vector<unsigned char> const& pids,
                                                          std::set<unsigned int> const& modules)
{
    std::vector<unsigned char> request{currentData};
    request.insert(request.end(), pids.begin(), pids.end());
    obd::ResponseMap responses;
    if (ask(request, modules, responses) != obd::IDevice::Status::Ok) {
        responses.clear();
    }
    PollTime const now = m_wire.now();
    std::map<unsigned int, Parts> all;
    for (unsigned int const module : modules) {
        auto const found = responses.find(module);
        std::optional<Parts> parts =
            judge(module, pids, found != responses.end() && !found->second.empty() ? &found->second : nullptr);
        if (!parts) {
            continue;
        }
        for (auto const& [pid, payload] : *parts) {
            m_wire.notes().note(module, pid, now);
        }
        all[module] = std::move(*parts);
    }
    return all;
}

std::optional<PollCycle::Parts> PollCycle::judge(unsigned int module, std::vector<unsigned char> const& pids,
                                                 std::vector<unsigned char> const* payload)
{
    MultiLimit& limit = m_limits.at(module);
    std::size_t const before = limit.now();
    std::optional<Parts> parts;
    if (payload == nullptr) {
        limit.missed(pids.size());
    } else {
        parts = payload->front() != negativeReply ? splitMultiReply(*payload, pids, m_length) : std::nullopt;
        if (!parts) {
            limit.failed(pids.size());
        } else if (parts->size() > 1) {
            limit.proved(parts->size());
        }
    }
    m_limitsChanged |= limit.now() != before;
    return parts;
}

bool PollCycle::finish(std::size_t member)
{
    std::optional<PollResult> const result = m_parameters[member]->run();
    {
        std::lock_guard const lock(m_mutex);
        m_now = m_wire.now();
        if (result) {
            m_meters[member].count(m_now);
        }
        m_silent[member] = result ? 0 : m_silent[member] + 1;
    }
    if (result) {
        m_sink(*result);
    }
    return result.has_value();
}

std::vector<PollRate> PollCycle::rates()
{
    std::vector<PollRate> rates;
    std::lock_guard const lock(m_mutex);
    for (std::size_t i = 0; i < m_wishes.size(); ++i) {
        rates.push_back(
            {m_wishes[i].module, m_wishes[i].pid, m_wishes[i].hertz, m_meters[i].hertz(m_now), m_silent[i]});
    }
    for (Guest const& guest : m_guests) {
        for (std::size_t i = 0; i < guest.wishes.size(); ++i) {
            PollGuestWish const& wish = guest.wishes[i];
            std::size_t const meter = guest.first + i;
            rates.push_back(
                {wish.module, wish.id, guest.hertz, m_meters[meter].hertz(m_now), m_silent[meter], wish.sensor});
        }
    }
    return rates;
}

void PollCycle::stop()
{
    for (Guest const& guest : m_guests) {
        guest.guest->stop();
    }
}

} // namespace velmora
