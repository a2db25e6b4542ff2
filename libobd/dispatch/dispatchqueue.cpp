#include "libobd/dispatch/dispatchqueue.h"

#include "libobd/dispatch/idispatchable.h"

namespace obd {

void DispatchQueue::push(std::weak_ptr<IDispatchable> const& work)
{
    std::lock_guard const lock(m_mutex);
    m_entries.push_back(work);
}

std::optional<std::weak_ptr<IDispatchable>> DispatchQueue::pop()
{
    std::lock_guard const lock(m_mutex);
    if (m_entries.empty()) {
        return std::nullopt;
    }
    std::weak_ptr<IDispatchable> oldest = std::move(m_entries.front());
    m_entries.pop_front();
    return oldest;
}

std::size_t DispatchQueue::size() const
{
    std::lock_guard const lock(m_mutex);
    return m_entries.size();
}

void DispatchQueue::clear()
{
    std::lock_guard const lock(m_mutex);
    m_entries.clear();
}

} // namespace obd
