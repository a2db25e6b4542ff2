#include "libvelmora/channel/bringupmemory.h"

#include <utility>

namespace velmora {

void BringUpMemory::start()
{
    m_on = true;
    m_begun = false;
    m_modules.clear();
    m_replies.clear();
}

void BringUpMemory::stop()
{
    m_on = false;
    m_replies.clear();
}

void BringUpMemory::remember(ElmCommand const& command, HealedReply const& reply)
{
    if (!m_on || !command.asksForMask() || reply.spoke.empty()) {
        return;
    }
    if (!std::exchange(m_begun, true)) {
        m_modules = reply.spoke;
        m_on = !reply.dropped; // of a reply that lost a line nobody knows who spoke
    }
    if (reply.whole() && reply.spoke == m_modules) {
        m_replies[command.text()] = reply.text();
    }
}

std::optional<std::string> BringUpMemory::recall(ElmCommand const& command) const
{
    auto const found = m_replies.find(command.text());
    return m_on && found != m_replies.end() ? std::optional(found->second) : std::nullopt;
}

} // namespace velmora
