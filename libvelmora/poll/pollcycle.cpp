#include "libvelmora/poll/pollcycle.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr int mostFailedTurns = 3;              // failed turns in a row
constexpr std::chrono::seconds silencePause{2}; // so that what stays silent does not hold up the rest

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
    return std::max(std::chrono::ceil<std::chrono::milliseconds>(start - now), std::chrono::milliseconds(0));
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
    } else if (++m_failures[task] >= mostFailedTurns) {
        m_scheduler.postpone(task, m_wire.now() + silencePause);
    }
    if (std::exchange(m_limitsChanged, false)) {
        plan();
    }
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
