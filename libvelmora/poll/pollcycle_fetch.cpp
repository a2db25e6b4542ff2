// How a cycle asks the vehicle: alone or together, and what it makes of the replies.

#include "libvelmora/poll/pollcycle.h"

#include <obd/nack.h>

#include <utility>

namespace velmora {

namespace {

constexpr unsigned char currentData = 0x01;
constexpr unsigned int pollReplyLimitMs = 1500;

std::set<unsigned int> modulesOf(std::vector<std::size_t> const& members, std::vector<PollWish> const& wishes)
{
    std::set<unsigned int> modules;
    for (std::size_t const member : members) {
        modules.insert(wishes[member].module);
    }
    return modules;
}

} // namespace

// What is of one module only may go to its own address, if that proves quicker than the replies of all.
obd::IDevice::Status PollCycle::ask(std::vector<unsigned char> const& request, std::set<unsigned int> const& modules,
                                    obd::ResponseMap& responses)
{
    if (!m_mayAddress || modules.size() != 1) {
        return m_wire.execute(request, responses, pollReplyLimitMs);
    }
    unsigned int const module = *modules.begin();
    AddressTrial& trial = m_trials[{module, request}];
    PollTime const start = m_wire.now();
    obd::IDevice::Status const status = m_wire.execute(request, responses, pollReplyLimitMs,
                                                       trial.isAddressed() ? std::optional(module) : std::nullopt);
    if (responses.contains(module)) {
        trial.answered(std::chrono::duration_cast<std::chrono::milliseconds>(m_wire.now() - start));
    } else {
        trial.missed();
    }
    return status;
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
    for (std::vector<unsigned char> const& group : evenGroups(inputs, limit)) {
        if (group.size() > 1) {
            lendGroup(parameter, group);
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
        parts = payload->front() != obd::negativeReply ? splitMultiReply(*payload, pids, m_length) : std::nullopt;
        if (!parts) {
            limit.failed(pids.size());
        } else if (parts->size() > 1) {
            limit.proved(parts->size());
        }
    }
    m_limitsChanged |= limit.now() != before;
    return parts;
}

} // namespace velmora
