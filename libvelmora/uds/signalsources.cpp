#include "libvelmora/uds/signalsources.h"

#include <fmt/format.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::size_t mostRequests = 8; // of a turn, so that other sensors do not wait long

// Where a group stands among the others: one for each module and rate.
std::string groupKey(std::optional<RequestAddress> const& address, std::optional<double> hertz)
{
    std::string const where = address
                                  ? fmt::format("{}/{}/{}/{}/{}/{}", address->header, address->reply, address->extended,
                                                address->tester, address->flowHeader, address->waitMs)
                                  : std::string();
    return fmt::format("{}@{}", where, hertz.value_or(0.0));
}

} // namespace

SignalSources::Group& SignalSources::groupFor(std::string const& key, std::vector<unsigned char> const& request,
                                              std::optional<RequestAddress> const& address, std::optional<double> hertz)
{
    auto found = m_open.find(key);
    auto const takes = [&request](Group const& group) {
        return group.requests.size() < mostRequests ||
               std::ranges::find(group.requests, request) != group.requests.end();
    };
    if (found == m_open.end() || !takes(m_groups[found->second])) {
        m_groups.push_back({std::make_shared<SignalGroup>(m_board, m_asker, address), hertz, {}});
        found = m_open.insert_or_assign(key, m_groups.size() - 1).first;
    }
    return m_groups[found->second];
}

void SignalSources::add(ChosenSignal const& signal, unsigned int module, std::optional<RequestAddress> const& address,
                        std::optional<double> hertz)
{
    std::vector<unsigned char> const& request = m_board->set()[signal.index].signal.request;
    Group& group = groupFor(groupKey(address, hertz), request, address, hertz);
    if (std::ranges::find(group.requests, request) == group.requests.end()) {
        group.requests.push_back(request);
    }
    group.guest->add(signal, module);
}

std::vector<PollSource> SignalSources::take()
{
    if (m_groups.empty() && !m_workedOut.empty()) {
        m_groups.push_back({std::make_shared<SignalGroup>(m_board, m_asker, std::nullopt), usualSignalRate, {}});
    }
    for (ChosenSignal const& each : std::exchange(m_workedOut, {})) {
        m_groups.back().guest->addWorkedOut(each);
    }
    std::vector<PollSource> sources;
    for (Group const& group : std::exchange(m_groups, {})) {
        sources.push_back({nullptr, nullptr, group.hertz, group.guest});
    }
    m_open.clear();
    return sources;
}

} // namespace velmora
