#include "libvelmora/read/groupedpids.h"

#include "libvelmora/read/multireply.h"

#include <obd/parameterfactory.h>
#include <obd/protocolfamily.h>

namespace velmora {

namespace {

using Status = obd::IDevice::Status;

constexpr unsigned char groupService = 0x01;
constexpr std::size_t mostInGroup = 6;
constexpr unsigned int groupLimitMs = 1500;

std::optional<std::size_t> groupedLength(unsigned char pid)
{
    return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id());
}

} // namespace

void GroupedPids::fetch(std::span<unsigned char const> pids)
{
    m_replies.clear();
    m_alone = m_alone || !obd::isCan(m_proxy->protocol());
    std::vector<unsigned char> group;
    for (std::size_t i = 0; i < pids.size() && !m_alone; ++i) {
        if (groupedLength(pids[i])) {
            group.push_back(pids[i]);
        }
        if (group.size() == mostInGroup || i + 1 == pids.size()) {
            m_alone = group.size() > 1 && !fetchGroup(group);
            group.clear();
        }
    }
}

// False if the module did not tell all of them. What came whole is kept even so.
bool GroupedPids::fetchGroup(std::vector<unsigned char> const& pids)
{
    std::vector<unsigned char> request{groupService};
    request.insert(request.end(), pids.begin(), pids.end());
    obd::ResponseMap responses;
    if (m_proxy->execute(request, responses, groupLimitMs) != Status::Ok) {
        return false;
    }
    auto const own = responses.find(m_module);
    auto const parts = own != responses.end() ? splitMultiReply(own->second, pids, groupedLength) : std::nullopt;
    if (!parts) {
        return false;
    }
    m_replies.insert(parts->begin(), parts->end());
    return parts->size() == pids.size();
}

std::vector<unsigned char> const* GroupedPids::known(std::vector<unsigned char> const& request) const
{
    bool const isSingle = request.size() == 2 && request[0] == groupService;
    auto const found = isSingle ? m_replies.find(request[1]) : m_replies.end();
    return found != m_replies.end() ? &found->second : nullptr;
}

Status GroupedPids::execute(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                            unsigned int timeoutMs)
{
    obd::AdapterNote ignored{};
    return executeNoted(request, responses, timeoutMs, ignored);
}

Status GroupedPids::executeNoted(std::vector<unsigned char> const& request, obd::ResponseMap& responses,
                                 unsigned int timeoutMs, obd::AdapterNote& note)
{
    if (std::vector<unsigned char> const* const reply = known(request)) {
        responses[m_module] = *reply;
        note = obd::AdapterNote::None;
        return Status::Ok;
    }
    return m_proxy->executeNoted(request, responses, timeoutMs, note);
}

} // namespace velmora
